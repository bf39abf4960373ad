#pragma once

#include <cstdint>
#include <string>

#include <hardware/sensors.h>
#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"
#include "core/SharedText.h"

namespace android {

class CounterProperty;

/** What the host tells with an action of the ultrasonic proximity sensor. */
struct UltraExceptionInfo {
    // The app that uses the sensor; read with an enable (3). Bytes past 1023 are cut.
    std::string packageName;
    int32_t phoneState = 0;  // 0: no phone call; read with a change of the phone state (6)
};

/** For the actions that read nothing of it. Each source file that includes this has its own. */
const UltraExceptionInfo kNoUltraExceptionInfo;

/**
 * Watches the ultrasonic proximity sensor: counts its enables, its failures, the phone calls that
 * use it and those among them that see a failure. Reports each failure at once and the calls once a
 * day, all as "N273|10011", with the latest energies that the sensor has told.
 *
 * Each count is kept in a property of its own and written when it is counted:
 *
 *     enables            "persist.zuno.ultra.enable.count"
 *     calls              "persist.zuno.ultra.phone.enable.count"
 *     calls that failed  "persist.zuno.ultra.invalid.count"
 *     invalid devices    "persist.zuno.device.invalid.count"
 *     invalid routes     "persist.zuno.route.invalid.count"
 *     receiver closures  "persist.zuno.rx.close.count"
 *
 * The daily reset takes the two counts of calls; the other four grow for the life of the device.
 * Each stops at 2147483646, but for the calls, which wrap at 32 bits.
 *
 * On a device for an overseas market nothing is watched: `isOverseas` has the answer of
 * `getOverseas()` at the time when the library was loaded.
 *
 * The operations that the worker thread runs say so; the host may call them too. The others are the
 * host's, from any thread. But for `getInstance()` nothing locks.
 */
class SENSOR_PRIV_EXPORT UltraException {
public:
    /**
     * The single instance; the first call creates it and, unless overseas, posts the load of the
     * stored counts, due 2000 ms later. Locks `sLock`.
     */
    static UltraException* getInstance();

    UltraException();
    virtual ~UltraException();

    /**
     * Whether the property "ro.zuno.product.overseas", read anew, makes this an overseas device:
     * any value but one that begins with "no" in any case does. Unset it does not.
     */
    static bool getOverseas();

    /**
     * Takes an action of the sensor; nothing if overseas. An enable takes the package and a change
     * of the phone state takes that state, at once on the caller's thread. Then the action is
     * posted, after one with the same code that still waits has been dropped: the two run as one.
     *
     *     1  load                   4  device invalid       7  daily reset
     *     2  receiver closed        5  route invalid        other codes are posted and ignored
     *     3  enabled                6  phone state changed
     */
    void doAction(int code, const UltraExceptionInfo& info);

    /**
     * Takes an energy from a sensor event whose `data[3]` tells which: 301 the background's, 302
     * the fluctuant one. `data[4]` is the energy. Both are truncated to 32-bit integers. Other
     * events are ignored; nothing is taken if overseas. Logs the energy while `mLogSwitch` is on.
     */
    void setUltraEnergy(const sensors_event_t& event);

    /** Sets the energies to 0 and the package to "unknown". */
    void resetUltraStatus();

    /**
     * Unless no call has been counted: sends the daily report on the caller's thread and posts the
     * reset, which runs after all that has been posted before.
     */
    void putPhoneOpenUltraTally();

    /** Posts the reset of the calls, overseas too. */
    void notifyUltraReset();

    /**
     * Worker thread: loads the stored counts, 0 for what is no number. What was counted before is
     * lost unless it has by then replaced the stored count.
     */
    void initUltraSoundCount();

    /**
     * Worker thread: counts an enable; during a call, the call then counts as one that uses the
     * sensor. The count is stored even if it did not rise.
     */
    void increaseEnableUltrasoundCount();

    // Worker thread: the failures, in events with the code 102, 101 and 100. Each does what
    // `updateUltraInvalid` does first. Then, unless its count has reached its limit, it raises the
    // count, sends it by `trackEvent` and only then stores it.

    void recordRxClose();
    void setUltraDeviceInvalid();
    void setUltraRouteInvalid();

    /**
     * Worker thread: while there is a call, and an app has enabled the sensor since it was reset,
     * the call counts as one that uses the sensor. When there is none, the last one has ended: it
     * is counted if it did, and the next call can fail again.
     */
    void updatePhoneOpenUltraCount();

    /** Worker thread: sets the calls and the failed calls to 0 and stores both, in this order. */
    void resetPhoneOpenUltraCount();

    /**
     * Worker thread: counts a failed call and stores the count, at most once until a call ends.
     * Only if the package's name contains that of the in-call screen, "com.android.incallui".
     */
    void updateUltraInvalid();

    /**
     * Sends an event with `code` as "ultraExpired", the share of `count` in the enables as
     * "TempInvalidRate", the package and the energies.
     */
    void trackEvent(std::string eventId, int code, int count);

private:
    class UltraExceptionHandler;

    SENSOR_PRIV_HIDDEN void countFailure(int32_t* count, int code, const CounterProperty& property);

    SENSOR_PRIV_HIDDEN void sendEvent(std::string eventId, int code, int32_t failures,
                                      int32_t uses);

    // Constant after construction.
    const sp<UltraExceptionHandler> mHandler;

    // What follows is read and written by the host's calls and by the worker thread without a lock,
    // on purpose: no call of the host's waits for the worker.
    int64_t mLoadTime = -1;  // elapsed real time of the load, ns; -1: not loaded

    // Part of the class's layout; nothing reads them.
    [[maybe_unused]] const int64_t mDayMs = 86'400'000;
    [[maybe_unused]] const int64_t mDayNs = 86'400'000'000'000;
    [[maybe_unused]] const int64_t mDayTime = -1;

    int32_t mEnableCount = 0;
    int32_t mInvalidCount = 0;      // calls that failed
    int32_t mPhoneEnableCount = 0;  // calls that used the sensor
    int32_t mDeviceInvalidCount = 0;
    int32_t mRouteInvalidCount = 0;
    int32_t mRxCloseCount = 0;
    int32_t mFluctuantEnergy = 0;
    int32_t mBackgroundEnergy = 0;
    SharedText mPackageName;             // of the latest enable, "unknown": none
    int32_t mPhoneState = 0;             // 0: no phone call
    bool mUltraOpenedInCall = false;     // the present call uses the sensor
    bool mInvalidCountedInCall = false;  // the present call has been counted as failed

    static Mutex sLock;
    static UltraException* mUltraException GUARDED_BY(sLock);
    static const bool isOverseas;  // set by the static initialiser
};

}  // namespace android
