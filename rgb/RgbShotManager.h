#pragma once

#include <cstdint>
#include <functional>
#include <queue>
#include <utility>
#include <vector>

#include <utils/Mutex.h>
#include <utils/String8.h>
#include <utils/Vector.h>

#include "core/Export.h"

namespace android {

/**
 * Rations the samples of the screen's colour that the host's light-sensor code takes, and takes
 * them. A budget says how many may be taken now; what happens on the device raises it, at once or,
 * through a queue, later. The host reports what happens, asks `allowRgbShot` in each turn of its
 * sampling loop, samples with `getScreenPixcel` if it may, and ends the loop on `stopRgbThread`.
 *
 * To raise the budget to a number is to set it to that number if it is smaller.
 *
 * All operations may be called from any thread; none reports an error. `mLock` is held for one
 * access to the queue at a time and never while calling out, but for the log line of `clearQueue`.
 * The other fields are plain ones without a lock: when calls race, a raise may be lost or a sample
 * be allowed twice.
 *
 * Times are milliseconds of the monotonic clock as `getCurrentMs` gives them.
 */
class SENSOR_PRIV_EXPORT RgbShotManager {
public:
    /** The single instance, created by the first call. Locks `sLock`. */
    static RgbShotManager* getInstance();

    /** Starts without budget, with an empty queue, in the mode that `isTestMode` reads. */
    RgbShotManager();

    /**
     * Reads the property "persist.sys.skip_restrict", 0 if it is unset, and logs the result: any
     * number but 0 is test mode, in which every sample is allowed. Text that is no number leaves
     * the mode as it was.
     */
    void isTestMode();

    /** Raises the budget to `shots`. */
    void setRgbShot(int shots);

    // What happened on the device, and the budget that it raises, now or in the given time.

    void onTouchChange();   // 1
    void luxChange();       // 2
    void colorChange();     // 3
    void onUserPresent();   // 3
    void autoModeChange();  // 3, and 3 in 8000 ms
    void eyeChange();       // 1 in 2000 ms
    void policyChange();    // 5 in 200 ms

    /** Raises the budget to `shots` in `delayMs`; a negative delay is over already. */
    void setRgbShotDelay(int shots, int delayMs);

    /**
     * 0: no sample is allowed until another status comes. Any other: that is over, and the budget
     * is raised to 2 now and to 2 in 8000 ms.
     */
    void onTransitionStatusChange(int status);

    /** Whether a transition status of 0 keeps samples from being taken. */
    bool skipLux();

    /**
     * The monotonic clock in milliseconds, computed in 32 bits: from 2^31 - 1, 24.8 days after the
     * device's boot, it goes to -2^31. Due times do not wrap with it: an entry due behind that
     * moment, once pending, stays so for as long as the process lives. This is meant so.
     */
    long long getCurrentMs();

    /** Queues a raise: when it is due, and to what. */
    void queuePush(std::pair<long long, int> entry);

    /**
     * Drops the entry that is due first; of several, the smallest raise. Callers ask `isEmpty`
     * first; if another thread has come in between and nothing is left, nothing happens.
     */
    void queuePop();

    /** Whether nothing is queued; what is pending is not. */
    bool isEmpty();

    /**
     * Drops all that is queued; logs it while `mLogSwitch` is on. What `isTimeToShot` has taken out
     * of the queue stays pending, and the budget stays.
     */
    void clearQueue();

    /**
     * Notes the entry that `queuePop` would drop as the pending one's time and budget, without
     * making it pending. An empty queue is treated as there. Returns 0.
     */
    int getWaitCount();

    /**
     * If nothing is pending, takes the first entry out of the queue; if the pending entry's time is
     * over (not if it is this very millisecond), raises the budget by it. One entry is pending at a
     * time: one queued later waits behind it even if it is due earlier.
     */
    void isTimeToShot();

    /**
     * Whether a sample may be taken now; takes it off the budget. Always in test mode, which takes
     * nothing off. Otherwise never while `policy` is 0 or `skipLux`, and the queue then stands
     * still; else calls `isTimeToShot` and answers by the budget.
     */
    bool allowRgbShot();

    /** Whether nothing is left to sample: no budget, nothing queued, nothing pending. */
    bool stopRgbThread();

    /**
     * Samples the display: averages the colours of the rectangle `rect` (left, top, right and
     * bottom in the display's pixels, the last two exclusive) into `rgbOut` (red, green and blue, 0
     * to 255), counts the sample and returns 1. Blocks until the capture is there, for as long as
     * it takes; the process must run the platform's binder threads. Takes no lock and no budget;
     * calls from several threads do not touch each other.
     *
     * Returns 0, logs why and leaves `rgbOut` as it is, if all of `rect` is 0, or the display has
     * no token, or the capture, its result or the access to its pixels fails.
     */
    int getScreenPixcel(int* rgbOut, int* rect);

private:
    using Entry = std::pair<long long, int>;  // when due, the budget that it raises to

    /** `getWaitCount`, but returns whether there was an entry to note. */
    SENSOR_PRIV_HIDDEN bool noteFirst();

    // Plain fields, read and written by every caller without a lock (see above).
    int32_t mShotBudget;
    int32_t mTestMode;
    bool mHasPending;
    bool mSkipLux;
    int64_t mPendingTime;
    int32_t mPendingShots;

    Mutex mLock;
    std::priority_queue<Entry, std::vector<Entry>, std::greater<Entry>> mShotQueue
            GUARDED_BY(mLock);

    // Constant after construction. Held for the object's life and never freed; nothing reads it.
    Vector<String8>* const mNameList;

    static Mutex sLock;
    static RgbShotManager* mRgbShot GUARDED_BY(sLock);
};

}  // namespace android
