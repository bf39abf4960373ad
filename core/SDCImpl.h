#pragma once

#include <string>

#include <hardware/sensors.h>
#include <utils/Mutex.h>
#include <utils/String8.h>
#include <utils/Vector.h>

#include "core/Export.h"

namespace android {

class FlowingDataException;
class MagneticUseIf;
class RegisterInfo;
class RgbShot;
class WechatProxException;

/**
 * The sensor service's entrance to the statistics modules. It routes each call by sensor type or by
 * hour of the day and keeps no state of its own.
 *
 * Any thread may call any operation. Only the modules behind it lock. None reports an error.
 *
 * What the arguments mean:
 *  - `pkg`: the connection's package name; for a component of the system server, the class name of
 *    its listener.
 *  - `opPkg`: the package that owns the connection.
 *  - `type`: the platform's sensor type. Types without a route are ignored.
 */
class SENSOR_PRIV_EXPORT SDCImpl {
public:
    /** The single instance. The first call creates it, its modules and the worker thread. */
    static SDCImpl* getInstance();

    SDCImpl();

    /**
     * A sensor was enabled or disabled for a connection. Only an enable has a `rate`. Tells the
     * type's module first. Then tells the chat-call monitor, whatever the type.
     */
    void enableSuccess(bool enabled, int type, const std::string& pkg, const std::string& opPkg,
                       long long rate);

    // These tell the type's module only.
    void handleEnable(int type, std::string pkg, std::string opPkg, long long rate);
    void handleDisable(int type, std::string pkg, std::string opPkg);

    /** A connection closed while it had `type` enabled. Counts as a disable. */
    void cleanupConnection(const String8& pkg, const String8& opPkg, int type);

    /** Does what `handleDisable` does. */
    void handleCleanupConnection(int type, std::string pkg, std::string opPkg);

    /** An event was dispatched. Costs one test unless the chat app holds the proximity sensor. */
    void process(const sensors_event_t& event);

    /** A notification of the system. Element 0 is its kind, which gives the others a meaning. */
    void setNotification(const Vector<int>& notification);

    /** 1, 2 and 3 are kinds of charging. Any other state is not charging. */
    void sendChargeState(int state);

    /** 1: the device has booted. Any other state: it is going down. */
    void sendBootShutdownRebootState(int state);

    /** The host's day counter. */
    void sendUsedTime(int uds);

    /** Counts one screen sample. */
    void setRgbShotCount();

    // The host calls each of these every hour with the hour of the day, 0 to 23. They act at the
    // hours given here and ignore the others. The host must call an hour's reports before its
    // resets.

    void notifySdcClock(int hour);          // 8: reports sensor exceptions; 23: usage, chat calls
    void notifySdcReset(int hour);          // resets the same at the same hours
    void putRgbShotTally(int hour);         // 7: reports screen samples
    void notifyRgbShotReset(int hour);      // 7: resets them
    void putPhoneOpenUltraTally(int hour);  // 7: reports the ultrasonic proximity sensor
    void notifyUltraReset(int hour);        // 7: resets it

private:
    // Constant after construction.
    RgbShot* const mRgbShot;
    FlowingDataException* const mFlowingDataException;
    WechatProxException* const mWechatProxException;
    MagneticUseIf* const mMagneticUseIf;
    RegisterInfo* const mRegisterInfo;

    static Mutex sLock;
    static SDCImpl* mSDC GUARDED_BY(sLock);
};

}  // namespace android
