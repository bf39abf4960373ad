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

/** What comes with an action of the ultrasonic proximity sensor. */
struct UltraExceptionInfo {
    std::string packageName;  // of the enabling app; bytes after the 1023rd are cut; for action 3
    int32_t phoneState = 0;   // 0: no phone call; for action 6
};

/** For the other actions. Each source file that includes this header has its own. */
const UltraExceptionInfo kNoUltraExceptionInfo;

/**
 * Watches the ultrasonic proximity sensor. All its events are "N273|10011" and carry the latest
 * energies. A failure is reported at once, calls are reported daily. Each count has a property:
 *
 *     enables                      "persist.zuno.ultra.enable.count"
 *     calls that used the sensor   "persist.zuno.ultra.phone.enable.count"
 *     calls that saw a failure     "persist.zuno.ultra.invalid.count"
 *     invalid devices              "persist.zuno.device.invalid.count"
 *     invalid routes               "persist.zuno.route.invalid.count"
 *     receiver closures            "persist.zuno.rx.close.count"
 *
 * The daily reset zeroes the two counts of calls. The others grow for the life of the device. The
 * calls that used the sensor wrap at 32 bits; the others stop at 2147483646.
 *
 * On an overseas device nothing is watched. This is decided when the library is loaded.
 *
 * Any thread may call any operation. Only `getInstance()` locks.
 */
class SENSOR_PRIV_EXPORT UltraException {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static UltraException* getInstance();

    /** Posts the load of the stored counts, due in 2000 ms, unless overseas. */
    UltraException();
    virtual ~UltraException();

    /** Whether "ro.zuno.product.overseas" is set now and does not begin with "no" in any case. */
    static bool getOverseas();

    /**
     * Takes an action of the sensor, unless overseas. 3 notes the package and 6 the phone state, at
     * once. Then the code is posted. If the same code still waits, it is dropped: two count as one.
     *
     *     1  load                   4  device invalid       7  daily reset
     *     2  receiver closed        5  route invalid        other codes do nothing
     *     3  enabled                6  phone state changed
     */
    void doAction(int code, const UltraExceptionInfo& info);

    /**
     * Takes the energy `data[4]` of a sensor event, unless overseas. `data[3]` tells which: 301
     * background, 302 fluctuant, other: none. Both are truncated to 32 bits. Logs the energy while
     * `mLogSwitch` is not 0.
     */
    void setUltraEnergy(const sensors_event_t& event);

    /** Sets the energies to 0 and the package to "unknown". */
    void resetUltraStatus();

    /** If a call was counted: sends the daily report on the caller's thread, posts the reset. */
    void putPhoneOpenUltraTally();

    /** Posts the reset of the calls, overseas too. */
    void notifyUltraReset();

    // The worker thread runs the rest. The host may call it too.

    /**
     * Loads the stored counts. Text that is no number reads as 0. A count that rose before the load
     * has already overwritten the stored one.
     */
    void initUltraSoundCount();

    /** Counts an enable and stores the count. In a call: marks the call as using the sensor. */
    void increaseEnableUltrasoundCount();

    // Failures, with the codes 102, 101 and 100. Each first runs `updateUltraInvalid`. Unless its
    // count is full, it then raises the count, sends it by `trackEvent` and stores it.
    void recordRxClose();
    void setUltraDeviceInvalid();
    void setUltraRouteInvalid();

    /**
     * In a call: marks it as using the sensor if an app is known. Otherwise: counts the call that
     * ended, if it was marked, and rearms failure counting.
     */
    void updatePhoneOpenUltraCount();

    /** Sets calls and failed calls to 0 and stores them, in this order. */
    void resetPhoneOpenUltraCount();

    /** Counts the call as failed and stores that, once a call, if the in-call screen is the app. */
    void updateUltraInvalid();

    /** Sends `code`, the ratio of `count` to all enables, the package and the energies. */
    void trackEvent(std::string eventId, int code, int count);

private:
    class UltraExceptionHandler;

    SENSOR_PRIV_HIDDEN void countFailure(int32_t* count, int code, const CounterProperty& property);

    SENSOR_PRIV_HIDDEN void sendEvent(std::string eventId, int code, int32_t failures,
                                      int32_t uses);

    // Constant after construction.
    const sp<UltraExceptionHandler> mHandler;

    // The host's threads and the worker share the rest without a lock, so that no host call waits.
    int64_t mLoadTime = -1;  // elapsed real time of the load, ns; -1: not loaded

    // Nothing reads these. They are part of the class's layout.
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
    bool mUltraOpenedInCall = false;     // this call uses the sensor
    bool mInvalidCountedInCall = false;  // this call was counted as failed

    static Mutex sLock;
    static UltraException* mUltraException GUARDED_BY(sLock);
    static const bool isOverseas;  // set by the static initialiser
};

}  // namespace android
