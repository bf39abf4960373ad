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
 * Watches which connections register the accelerometer (sensor types 1 and 35) and the gyroscope (4
 * and 16), at which rate and for how long, and reports the longest ones once a day: "N273|10003"
 * for the accelerometer, "N273|10004" for the gyroscope. Nothing is persisted. `SDCImpl` calls it.
 *
 * All operations may be called from any thread; each list locks itself, never both at once.
 */
class SENSOR_PRIV_EXPORT RegisterInfo {
public:
    /** The single instance, created by the first call. Locks `sLock`. */
    static RegisterInfo* getInstance();

    RegisterInfo();

    /** Notes an enable at `rate`, in the host's unit: the smaller the faster. Other types: none. */
    void handleEnable(int type, std::string pkg, std::string opPkg, long long rate);

    /** Notes a disable or a clean-up. */
    void handleDisable(int type, std::string pkg, std::string opPkg);

    /**
     * Takes the display state from element 2 of a notification whose element 0, its kind, is 2.
     * Other kinds, and lists too short for theirs, are ignored.
     */
    void setNotification(const Vector<int>& values);

    /** Passes the display state (2: on) to both lists. */
    void setDisplayState(int state);

    /** Posts the daily report to the worker thread. */
    void notifyDayNight();

    /** Sends the daily report of each list that has something to report, accelerometer first. */
    void putPkgInfoTally();

    /** Empties both lists at once, on the caller's thread: before a report that is still posted. */
    void notifyRegisterInfoReset();

private:
    class RegisterHandler;

    /** The list for `type`, null if none. */
    SENSOR_PRIV_HIDDEN RegisterConnectionList* listFor(int type) const;

    // Constant after construction.
    RegisterConnectionList* const mAccConnections;
    RegisterConnectionList* const mGyroConnections;
    const sp<RegisterHandler> mHandler;

    static Mutex sLock;
    static RegisterInfo* mInstance GUARDED_BY(sLock);
};

}  // namespace android
