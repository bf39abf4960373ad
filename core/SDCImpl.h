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
 * The object through which the sensor service feeds the statistics modules: it routes each call by
 * sensor type or by hour of the day, and keeps no state of its own.
 *
 * All operations may be called from any thread and take no lock but those of the modules that they
 * reach. None reports an error.
 *
 * `pkg` is the connection's package name (of a component of the system server, its listener's class
 * name), `opPkg` the package that owns it; `type` is a sensor type of the platform. Types without a
 * route do nothing.
 */
class SENSOR_PRIV_EXPORT SDCImpl {
public:
    /**
     * The single instance; the first call creates it and with it, in the order of its members, the
     * modules, and with the first of these the worker thread. Locks `sLock`.
     */
    static SDCImpl* getInstance();

    SDCImpl();

    /**
     * A sensor was enabled, or disabled, for a connection; `rate` belongs to an enable only. After
     * the module of the type's route, the chat-call monitor sees it, whatever the type.
     */
    void enableSuccess(bool enabled, int type, const std::string& pkg, const std::string& opPkg,
                       long long rate);

    void handleEnable(int type, std::string pkg, std::string opPkg, long long rate);
    void handleDisable(int type, std::string pkg, std::string opPkg);

    /** A connection was closed that still had `type` enabled: counts as a disable. */
    void cleanupConnection(const String8& pkg, const String8& opPkg, int type);

    void handleCleanupConnection(int type, std::string pkg, std::string opPkg);

    /**
     * Hands on an event that the host dispatches. It is called for every one of them: unless the
     * chat application holds the proximity sensor it costs one test of a flag.
     */
    void process(const sensors_event_t& event);

    /**
     * Hands on a notification, to the chat-call monitor first: element 0 is its kind, the rest is
     * as the kind has it.
     */
    void setNotification(const Vector<int>& notification);

    /** The charge state: 1, 2 and 3 are kinds of charging, any other is none. */
    void sendChargeState(int state);

    /** 1: the device has booted; any other: it is going down. */
    void sendBootShutdownRebootState(int state);

    /** The host's count of days. */
    void sendUsedTime(int uds);

    /** Counts one screen sample. */
    void setRgbShotCount();

    // The host calls each of these once an hour with the hour of the day, 0 to 23; they act on one
    // or two hours each and ignore the rest. Reports come before the resets of the same hour
    // because the host calls them in that order; nothing here enforces it.

    /** 8: the daily report of sensor exceptions. 23: the daily reports. */
    void notifySdcClock(int hour);

    /** 8: the daily reset of sensor exceptions. 23: the daily resets. */
    void notifySdcReset(int hour);

    /** 7: the daily report of screen samples. */
    void putRgbShotTally(int hour);

    /** 7: the daily reset of screen samples. */
    void notifyRgbShotReset(int hour);

    /** 7: the daily report of the ultrasonic proximity sensor. */
    void putPhoneOpenUltraTally(int hour);

    /** 7: the daily reset of the ultrasonic proximity sensor. */
    void notifyUltraReset(int hour);

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
