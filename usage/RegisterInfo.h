#pragma once

#include <string>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>
#include <utils/Vector.h>

#include "core/Export.h"

namespace android {

class RegisterConnectionList;

/**
 * Watches which connections register the accelerometer and the gyroscope, calibrated or not, at
 * which rate and for how long. Reports the longest ones daily: "N273|10003" for the accelerometer,
 * "N273|10004" for the gyroscope. Nothing is stored. `SDCImpl` calls it.
 *
 * Any thread may call any operation. Each list locks itself; both are never locked at once.
 */
class SENSOR_PRIV_EXPORT RegisterInfo {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static RegisterInfo* getInstance();

    RegisterInfo();

    /** Notes an enable at `rate`, in the host's unit; smaller is faster. Ignores other types. */
    void handleEnable(int type, std::string pkg, std::string opPkg, long long rate);

    /** Notes a disable or a clean-up. */
    void handleDisable(int type, std::string pkg, std::string opPkg);

    /**
     * Takes the display state from element 2 of a notification of kind 2; element 0 is the kind.
     * Ignores other kinds and lists that are too short.
     */
    void setNotification(const Vector<int>& values);

    /** Passes the display state to both lists; 2 is on. */
    void setDisplayState(int state);

    /** Posts the daily report. */
    void notifyDayNight();

    /** Reports each list that has something to report, the accelerometer's first. */
    void putPkgInfoTally();

    /** Empties both lists on the caller's thread. */
    void notifyRegisterInfoReset();

private:
    class RegisterHandler;

    /** The list for `type`, or null. */
    SENSOR_PRIV_HIDDEN RegisterConnectionList* listFor(int type) const;

    // Constant after construction.
    RegisterConnectionList* const mAccConnections;
    RegisterConnectionList* const mGyroConnections;
    const sp<RegisterHandler> mHandler;

    static Mutex sLock;
    static RegisterInfo* mInstance GUARDED_BY(sLock);
};

}  // namespace android
