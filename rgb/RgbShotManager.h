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
 * Rations samples of the screen's colour, and takes them.
 *
 * A budget says how many samples may be taken now. Events on the device raise it to a number, at
 * once or after a delay. A budget that is higher stays. Delayed raises wait in a queue. One at a
 * time is taken out of the queue and stays pending until it is due. The host's sampling loop asks
 * `allowRgbShot`, samples with `getScreenPixcel` if it may, and ends on `stopRgbThread`.
 *
 * Any thread may call any operation. Only `getScreenPixcel` reports errors. `mLock` guards the
 * queue, for one access at a time. The other fields have no lock: calls that race may lose a raise
 * or allow a sample twice.
 */
class SENSOR_PRIV_EXPORT RgbShotManager {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static RgbShotManager* getInstance();

    /** Starts with a budget of 0 and reads the test mode. */
    RgbShotManager();

    /**
     * Reads the test mode from "persist.sys.skip_restrict" and logs it. 0 or unset: off. Any other
     * number: on, and every sample is allowed. Other text leaves the mode as it was.
     */
    void isTestMode();

    /** Raises the budget to `shots`. */
    void setRgbShot(int shots);

    // Events, and what they raise the budget to.
    void onTouchChange();   // 1
    void luxChange();       // 2
    void colorChange();     // 3
    void onUserPresent();   // 3
    void autoModeChange();  // 3, and 3 in 8000 ms
    void eyeChange();       // 1 in 2000 ms
    void policyChange();    // 5 in 200 ms

    /** Raises the budget to `shots` in `delayMs`. A negative delay is over already. */
    void setRgbShotDelay(int shots, int delayMs);

    /**
     * 0 blocks sampling. Any other status unblocks it and raises the budget to 2, now and again in
     * 8000 ms.
     */
    void onTransitionStatusChange(int status);

    /** Whether a transition status blocks sampling. */
    bool skipLux();

    /**
     * The monotonic clock in milliseconds, as a 32-bit number: after 2^31 - 1, which is 24.8 days,
     * comes -2^31. Due times do not wrap: an entry that is pending across that moment may stay so
     * for the life of the process. This is intended.
     */
    long long getCurrentMs();

    /** Queues a raise: when it is due, as `getCurrentMs` counts, and to what. */
    void queuePush(std::pair<long long, int> entry);

    /** Drops the first entry, if there is one: the earliest due, of these the smallest raise. */
    void queuePop();

    /** Whether the queue is empty. A pending entry is not in the queue. */
    bool isEmpty();

    /** Empties the queue. Pending entry and budget stay. Logs while `mLogSwitch` is not 0. */
    void clearQueue();

    /** Notes the queue's first entry, if there is one, as the next to be pending. Returns 0. */
    int getWaitCount();

    /**
     * If nothing is pending, takes the first entry out of the queue. Then, if the pending entry's
     * due time has passed, raises the budget. A due time of this very millisecond has not passed.
     * An entry queued later waits behind the pending one, even if it is due earlier.
     */
    void isTimeToShot();

    /**
     * Whether a sample may be taken now. If so, takes it off the budget.
     *  - In test mode: always, and takes nothing off.
     *  - While `policy` is 0 or `skipLux()`: never, and the queue stands still.
     *  - Otherwise: runs `isTimeToShot`, then answers by the budget.
     */
    bool allowRgbShot();

    /** Whether nothing is left to sample: no budget, an empty queue, nothing pending. */
    bool stopRgbThread();

    /**
     * Averages the display's colours within `rect` into `rgbOut`, counts the sample, returns 1.
     *  - `rect`: left, top, right, bottom, in pixels of the display in its natural orientation, in
     *    whatever orientation it is. Right and bottom are exclusive.
     *  - `rgbOut`: red, green, blue, 0 to 255.
     *
     * Returns 0, logs why and leaves `rgbOut` alone if `rect` is all 0, the display has no token,
     * or the capture, its result or the access to its pixels fails. On platform versions that turn
     * `rect` with the display's content, a turn during the call may misplace this one sample.
     *
     * Blocks until the capture arrives, without a time-out: the process must run binder threads.
     * Takes no lock and no budget. Calls on several threads are independent.
     */
    int getScreenPixcel(int* rgbOut, int* rect);

private:
    using Entry = std::pair<long long, int>;  // when due, the budget that it raises to

    /** Does what `getWaitCount` does, and returns whether there was an entry. */
    SENSOR_PRIV_HIDDEN bool noteFirst();

    // Read and written by every caller without a lock.
    int32_t mShotBudget;
    int32_t mTestMode;
    bool mHasPending;
    bool mSkipLux;
    int64_t mPendingTime;
    int32_t mPendingShots;

    Mutex mLock;
    std::priority_queue<Entry, std::vector<Entry>, std::greater<Entry>> mShotQueue
            GUARDED_BY(mLock);

    // Constant after construction. Never freed. Nothing in the library reads it.
    Vector<String8>* const mNameList;

    static Mutex sLock;
    static RgbShotManager* mRgbShot GUARDED_BY(sLock);
};

}  // namespace android
