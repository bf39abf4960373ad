#pragma once

#include <array>
#include <cstdint>
#include <string>

#include <hardware/sensors.h>
#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>
#include <utils/Vector.h>

#include "core/Export.h"

namespace android {

/**
 * Watches the chat application "com.tencent.mm" while it holds the proximity sensor, a session. In
 * a voice call the display controller is expected to hold the sensor too and to switch the screen
 * off; a phone that stays near without that has locked up, and the monitor reports at once how it
 * moved before it went near, the spread of its accelerometer readings. It keeps four counters of
 * the day in "persist.zuno.wechat.count.info" and reports them daily. Both go out as "N273|10013".
 *
 * The counters count in voice calls only: voice mode 1 (handset) or 2 (speaker), and a camera state
 * other than 1. They wrap at 32 bits.
 *
 * Applications are told by containment: a name that has the one looked for anywhere in it is it.
 *
 * The host calls from its own threads, through `SDCImpl`; the operations under "on the worker" run
 * on the worker thread. Apart from `getInstance()` nothing locks: see the members.
 */
class SENSOR_PRIV_EXPORT WechatProxException {
public:
    /**
     * The single instance; the first call creates it and posts the load of the stored counters, due
     * 2000 ms later. Locks `sLock`.
     */
    static WechatProxException* getInstance();

    WechatProxException();
    virtual ~WechatProxException();

    /**
     * An enable, or a disable or clean-up, of a sensor of any type.
     *  - Accelerometer (type 1), enabled by the chat application: clears the kept readings, not
     *    their count.
     *  - Proximity (type 8): first as `handleProxWakeLock`. Then, by the chat application, an
     *    enable starts a session, in which the last distance is unknown. A disable ends it, counts
     *    it if it went near, and again as invalid if it was reported, and stores the counters at
     *    once, on the worker. A second disable does the same again.
     */
    void enableSuccess(bool enabled, int type, const std::string& pkg, const std::string& opPkg);

    /**
     * The proximity sensor was enabled or disabled for `pkg`: notes whether the display controller
     * holds it, and counts each of its enables in a voice call within a session.
     */
    void handleProxWakeLock(const std::string& pkg, bool enabled);

    /**
     * Takes accelerometer (type 1) and proximity (type 8) events during a session. Outside one it
     * only tests a flag: the host calls this for every event that it dispatches.
     */
    void process(const sensors_event_t& event);

    /**
     * Takes the voice mode from element 7 of a notification of kind 7, and the camera state from
     * element 11 of one of kind 10; element 0 is the kind. Other kinds, and lists too short for
     * theirs, are ignored.
     */
    void setNotification(const Vector<int>& notification);

    void setVoiceMode(int mode);
    void setCameraState(int state);

    /** Whether the voice mode is 1 or 2. */
    bool isHandSetOrSpeaker();

    /** Posts the daily report. */
    void notifyDayNight();

    /**
     * Sets the counters to 0 at once, on the caller's thread, and then stores them on the worker.
     * A report that is still posted finds no session and sends nothing.
     */
    void resetWechatCount();

    /**
     * Keeps the first three values of an accelerometer event as the newest reading and counts it,
     * unless the phone is near or the last reading was kept less than 20000001 ns ago.
     */
    void getAccData(const sensors_event_t& event);

    /**
     * Takes the distance, the first value of a proximity event truncated to an integer; the same
     * one again does nothing. Far (5) starts a new count of readings. Near (0) counts in a voice
     * call. Any distance but far starts the checks anew: the first is due 100 ms later, instead of
     * one that is pending.
     */
    void processProxEvent(const sensors_event_t& event);

    // On the worker.

    /** Replaces the counters by the stored ones, or leaves them if fewer than four are stored. */
    void initialize();

    /**
     * The check of a near period, every 100 ms. It computes the spread while the phone is near in a
     * voice call and the display controller does not hold the sensor, until the session has been
     * reported; the fifth check in a row reports it. If the phone went far after the first check,
     * the next one reports what the last one computed. Going far ends the checks.
     */
    void checkProxLock();

    /** Stores the counters: total, invalid, lock and near, joined by "_". */
    void updatePropertyValue();

    /** Reports the counters of the day, unless no session was counted; they stay as they are. */
    void putWechatTally();

    /**
     * Reports the last computed spread, whatever it is, and marks the session as reported, which
     * ends its checks.
     */
    void recordAccVariance();

    /**
     * The spread of the kept readings `from` to `to` - 1, 0 being the newest: the population
     * standard deviation of each axis, over `to` - `from` readings, into `sx`, `sy` and `sz`.
     * Returns them as text, six decimals each, joined by "/". There are 20 readings; what lies
     * outside them adds nothing. No readings have a spread of 0, of -0 if `to` is below `from`.
     *
     * All is computed in `float`, in the order of the readings, so that it comes out alike on
     * every platform; a NaN is printed without a sign.
     */
    std::string getVariance(int from, int to, float& sx, float& sy, float& sz);

private:
    class WechatProxExceptionHandler;
    using AccSample = std::array<float, 3>;  // x, y, z

    /** Whether the counters count now. */
    SENSOR_PRIV_HIDDEN bool isVoiceCall();

    // Constant after construction.
    const sp<MessageHandler> mHandler;

    // The rest is shared by the host's threads and the worker without a lock, on purpose: readings
    // and resets may interleave, and the events' path stays free of locks.

    // Counters of the day, as stored and reported.
    int mNearCount = 0;     // near events
    int mInvalidCount = 0;  // sessions of which the spread was reported
    int mLockCount = 0;     // enables by the display controller
    int mTotalCount = 0;    // sessions with a near event

    bool mWechatProxEnabled = false;   // a session is open
    bool mDisplayProxEnabled = false;  // the display controller holds the proximity sensor
    int mVoiceMode = -1;               // -1: not known yet
    int mCameraState = -1;             // -1: not known yet
    [[maybe_unused]] int mReserved[3] = {0, -1, -1};  // part of the class's layout

    int mLastProxValue = -1;                  // distance: 0 near, 5 far, -1 unknown
    std::array<AccSample, 20> mAccSamples{};  // newest first
    int64_t mLastAccTime = -1;                // monotonic ns; of the newest reading

    // Of the session: whether a near event was counted, whether the spread was reported.
    bool mNearSeen = false;
    bool mVarianceReported = false;

    int mCheckCount = 0;        // number of the next check in this near period, from 1
    int mAccCount = 0;          // readings kept since the last far, those shifted out included
    std::string mVarianceText;  // the last computed spread; the worker's own

    static Mutex sLock;
    static WechatProxException* mWechatProxException GUARDED_BY(sLock);
};

}  // namespace android
