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
 * Watches the proximity sensor during calls of the chat application "com.tencent.mm".
 *
 * A session lasts while that application holds the sensor. In a voice call, the display controller
 * should hold the sensor too and switch the screen off. If the phone stays near without that, it
 * has locked up. The monitor then reports at once how the phone moved before it went near, as the
 * spread of its accelerometer readings.
 *
 * Four counters of the day count in voice calls only, that is in voice mode 1 (handset) or 2
 * (speaker) with a camera state other than 1. They wrap at 32 bits. They are kept in
 * "persist.zuno.wechat.count.info" and reported daily. Both reports are "N273|10013".
 *
 * Names match by substring.
 *
 * Any thread may call what the worker thread does not run. Only `getInstance()` locks.
 */
class SENSOR_PRIV_EXPORT WechatProxException {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static WechatProxException* getInstance();

    /** Posts the load of the stored counters, due in 2000 ms. */
    WechatProxException();
    virtual ~WechatProxException();

    /**
     * A sensor was enabled or disabled. A clean-up counts as a disable.
     *  - Accelerometer, enabled by the chat application: clears the readings, but not their count.
     *  - Proximity, by any application: runs `handleProxWakeLock`.
     *  - Proximity, enabled by the chat application: starts a session.
     *  - Proximity, disabled by it: ends the session and posts the save of the counters. Counts the
     *    session if it went near, and as invalid if it was reported. A second disable counts again.
     */
    void enableSuccess(bool enabled, int type, const std::string& pkg, const std::string& opPkg);

    /** Notes whether the display controller holds the sensor. Counts its enables in a session. */
    void handleProxWakeLock(const std::string& pkg, bool enabled);

    /** Takes accelerometer and proximity events during a session. Otherwise only tests a flag. */
    void process(const sensors_event_t& event);

    /**
     * Takes the voice mode from element 7 of a notification of kind 7, and the camera state from
     * element 11 of one of kind 10. Ignores other kinds and lists that are too short.
     */
    void setNotification(const Vector<int>& notification);

    void setVoiceMode(int mode);
    void setCameraState(int state);

    /** Whether the voice mode is 1 or 2. */
    bool isHandSetOrSpeaker();

    /** Posts the daily report. */
    void notifyDayNight();

    /** Sets the counters to 0 on the caller's thread and posts their save. */
    void resetWechatCount();

    /** Keeps a reading, unless the phone is near or 20 ms or less have passed since the last. */
    void getAccData(const sensors_event_t& event);

    /**
     * Takes a distance, truncated to an integer. The same one again does nothing.
     *  - Far (5): starts a new count of readings.
     *  - Near (0): counts in a voice call.
     *  - All but far: start the checks anew, the first one due in 100 ms.
     */
    void processProxEvent(const sensors_event_t& event);

    // The worker thread runs the rest. The host must not call it.

    /** Loads the counters, or leaves them if fewer than four are stored. */
    void initialize();

    /**
     * Checks a near period every 100 ms.
     *  - Near in a voice call, the display controller without the sensor, no report yet: computes
     *    the spread. The fifth check in a row reports it.
     *  - Gone far after the first check: reports the spread of the last check, and ends.
     */
    void checkProxLock();

    /** Stores the counters: total, invalid, lock and near, joined by "_". */
    void updatePropertyValue();

    /** Reports the counters, unless no session was counted. They stay as they are. */
    void putWechatTally();

    /** Reports the last computed spread, marks the session as reported and ends its checks. */
    void recordAccVariance();

    /**
     * The standard deviation of each axis over readings `from` to `to` - 1 of 20, the newest being
     * 0. Writes it to `sx`, `sy`, `sz` and returns it as text: six decimals each, joined by "/".
     *  - Readings outside the 20 add nothing, but count in the divisor `to` - `from`.
     *  - No readings: 0. `to` below `from`: -0.
     *  - A NaN has no sign. All is computed in `float`, alike on every platform.
     */
    std::string getVariance(int from, int to, float& sx, float& sy, float& sz);

private:
    class WechatProxExceptionHandler;
    using AccSample = std::array<float, 3>;  // x, y, z

    /** Whether the counters count now. */
    SENSOR_PRIV_HIDDEN bool isVoiceCall();

    // Constant after construction.
    const sp<MessageHandler> mHandler;

    // The host's threads and the worker share the rest without a lock, so that no event waits.

    // Counters of the day.
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

    bool mNearSeen = false;          // a near event was counted in this session
    bool mVarianceReported = false;  // the spread was reported in this session

    int mCheckCount = 0;        // the next check's number in this near period, from 1
    int mAccCount = 0;          // readings kept since the last far, those shifted out included
    std::string mVarianceText;  // the last computed spread; the worker's own

    static Mutex sLock;
    static WechatProxException* mWechatProxException GUARDED_BY(sLock);
};

}  // namespace android
