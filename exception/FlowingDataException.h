#pragma once

#include <cstdint>
#include <map>
#include <string>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"

namespace android {

/** An open proximity session: one client's use of the proximity sensor. */
struct ProxInfo {
    int64_t startTime = 0;  // monotonic ns of the latest enable; 0: never started
    int32_t duration = 0;   // whole seconds up to the latest enable
    int32_t count = 0;      // enables minus disables
};

/**
 * Counts the exceptions that the sensor service detects in the data of motion and environment
 * sensors, and times the proximity sessions of each app.
 *
 * There is one detect count for each sensor family. In the order of their slots, with the sensor
 * types of the platform that belong to them, the type that stands for them in reports first:
 *
 *     0  accelerometer    1, 9, 10, 35  "N273|10003"
 *     1  gyroscope        4, 16         "N273|10004"
 *     2  magnetic field   2, 14         "N273|10005"
 *     3  light            5             "N273|10006"
 *     4  orientation      3             "N273|10007"
 *     5  rotation vector  11            "N273|10008"
 *
 * The counts are kept in "persist.zuno.flow.detect.count", six decimal numbers in this order joined
 * by commas, and reported once a day. They belong to the worker thread, which every operation on
 * them says; the others may be called from any thread.
 *
 * Sessions live in memory only and are reported when they end, on the thread that ends them.
 */
class SENSOR_PRIV_EXPORT FlowingDataException {
public:
    /** The single instance, created by the first call. Locks `sLock`. */
    static FlowingDataException* getInstance();

    /** Starts with counts of 0; the stored ones are loaded when the device has booted. */
    FlowingDataException();

    /**
     * Posts the load of the stored counts. What is counted before it runs has by then replaced
     * them.
     */
    void notifyBootCompleted();

    /**
     * Notes an exception of a sensor: its family's count rises by one 11 s after the last of a run
     * of notifications for that family. Types without a family are ignored.
     */
    void notifyUpdateDetectCount(int sensorType);

    /**
     * Posts the reports of all families in the order of their slots, then a reset, and a second
     * reset due 2000 ms later for what is counted in between.
     */
    void putDetectTally();

    /** Drops every reset that is still pending and posts one, due 2000 ms later. */
    void notifyFlowReset();

    /**
     * Reports one family, slot + 10, at once on the caller's thread, reading its count while the
     * worker may change it. Other codes do nothing.
     */
    void notifyPutTally(int code);

    /**
     * Worker thread: loads the stored counts. A number that cannot be read is 0. A record that is
     * missing, begins with "unknown" in any case, or has other than six fields (empty ones are
     * passed over), resets the counts.
     */
    void initDetectCount();

    /**
     * Worker thread: adds one to a family's count, slot + 2, and stores all counts. A count that
     * has reached 2147483646 stays there, and nothing is stored. Other codes do nothing.
     */
    void updateDetectCountByType(int code);

    /** Worker thread: sets all counts to 0 and stores them, whatever they were. */
    void resetDetectCount();

    /**
     * Sends `count` as the daily event of the family that `sensorType` belongs to; nothing if there
     * is no such family or nothing was counted. The event's key is "reason". May be called from any
     * thread.
     */
    void setSensorException(int sensorType, int count);

    /** The event id of the family that `sensorType` belongs to, "-1" if there is none. */
    std::string getEventID(int sensorType);

    /** `value` in decimal. */
    std::string convertIntToString(int value);

    /**
     * An enable of the proximity sensor by the client pkg/opPkg: opens its session, or nests in it.
     * The seconds since the previous enable are then added to the session and the clock starts
     * again, so that each nesting loses a fraction of a second. Holds `mProxLock`.
     */
    void setProxEnable(std::string pkg, std::string opPkg);

    /**
     * A disable. The one that matches the session's first enable ends it, and `setProxTally` gets
     * it if it has lasted for more than 1800 s. A client without a session is ignored. Holds
     * `mProxLock`, but not while reporting.
     */
    void setProxDisable(std::string pkg, std::string opPkg);

    /**
     * Sends a session of `seconds` as "N273|10010", unless one of the names contains that of a
     * system or maker package, wherever it stands in it. Touches no member.
     */
    void setProxTally(std::string pkg, std::string opPkg, int seconds);

private:
    class SensorDetectHandler;

    SENSOR_PRIV_HIDDEN void putFamilyTally(int slot);
    SENSOR_PRIV_HIDDEN void storeDetectCount();

    static constexpr int kFamilies = 6;

    std::map<std::string, ProxInfo> mProxInfoMap GUARDED_BY(mProxLock);  // by "pkg/opPkg"
    Mutex mProxLock;

    // Constant after construction.
    const sp<SensorDetectHandler> mHandler;

    // By slot. Touched on the worker thread only, but for the read in notifyPutTally, which is
    // deliberately unlocked.
    int32_t mDetectCount[kFamilies];

    static Mutex sLock;
    static FlowingDataException* mFlowingDataException GUARDED_BY(sLock);
};

}  // namespace android
