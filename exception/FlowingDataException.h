#pragma once

#include <cstdint>
#include <map>
#include <string>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"

namespace android {

/** An open proximity session of one connection. */
struct ProxInfo {
    int64_t startTime = 0;  // monotonic ns of the latest enable; 0: never started
    int32_t duration = 0;   // whole seconds up to the latest enable
    int32_t count = 0;      // enables minus disables
};

/**
 * Counts the exceptions that the sensor service detects in a sensor's data, and times the proximity
 * sessions of each connection.
 *
 * Each family of sensors has a detect count in a slot of its own:
 *
 *     slot  sensors                                                     event
 *     0     accelerometer, gravity, linear acceleration, uncalibrated   "N273|10003"
 *     1     gyroscope, uncalibrated                                     "N273|10004"
 *     2     magnetic field, uncalibrated                                "N273|10005"
 *     3     light                                                       "N273|10006"
 *     4     orientation                                                 "N273|10007"
 *     5     rotation vector                                             "N273|10008"
 *
 * "persist.zuno.flow.detect.count" keeps the counts: six decimal numbers in this order, joined by
 * commas. They are reported daily. Sessions live in memory only and are reported when they end.
 *
 * Any thread may call the operations that do not name the worker thread.
 */
class SENSOR_PRIV_EXPORT FlowingDataException {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static FlowingDataException* getInstance();

    /** Starts with counts of 0. `notifyBootCompleted` loads the stored ones. */
    FlowingDataException();

    /** Posts the load of the counts. What was counted before has overwritten the stored ones. */
    void notifyBootCompleted();

    /**
     * Notes an exception of a sensor. Its family's count rises by one, 11 s after the last of a run
     * of exceptions in that family. Types without a family are ignored.
     */
    void notifyUpdateDetectCount(int sensorType);

    /** Posts the reports of all families by slot, then a reset, and another one due in 2000 ms. */
    void putDetectTally();

    /** Drops the pending resets and posts one, due in 2000 ms. */
    void notifyFlowReset();

    /** Reports the family of slot `code` - 10 on the caller's thread. Ignores other codes. */
    void notifyPutTally(int code);

    /**
     * Worker thread: loads the stored counts. A field that is no number reads as 0. Resets the
     * counts if the record is missing, begins with "unknown" in any case, or has not six fields.
     * Empty fields do not count.
     */
    void initDetectCount();

    /**
     * Worker thread: raises the count of slot `code` - 2 by one and stores all counts. A count of
     * 2147483646 stays, and nothing is stored. Ignores other codes.
     */
    void updateDetectCountByType(int code);

    /** Worker thread: sets all counts to 0 and stores them. */
    void resetDetectCount();

    /** Sends the type's daily event, unless it has no family or `count` is 0. Any thread. */
    void setSensorException(int sensorType, int count);

    /** The event id of the type's family, or "-1". */
    std::string getEventID(int sensorType);

    /** `value` in decimal. */
    std::string convertIntToString(int value);

    /**
     * The connection enabled the proximity sensor: opens its session, or nests in it. Nesting adds
     * the whole seconds so far to the session and restarts the clock. Locks `mProxLock`.
     */
    void setProxEnable(std::string pkg, std::string opPkg);

    /**
     * The connection disabled the sensor. With its last enable the session ends; one of more than
     * 1800 s goes to `setProxTally`, without the lock. Without a session: ignored. Locks
     * `mProxLock`.
     */
    void setProxDisable(std::string pkg, std::string opPkg);

    /** Sends a session as "N273|10010", unless a name holds that of a system or maker package. */
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

    // By slot. The worker's own, but `notifyPutTally` reads them without a lock.
    int32_t mDetectCount[kFamilies];

    static Mutex sLock;
    static FlowingDataException* mFlowingDataException GUARDED_BY(sLock);
};

}  // namespace android
