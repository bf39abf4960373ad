#pragma once

#include <cstdint>
#include <string>
#include <unordered_map>
#include <utility>

#include <utils/Mutex.h>

#include "core/Export.h"

namespace android {

/** One connection's use of a motion sensor. */
struct PkgRegInfo {
    int64_t beginTime = 0;    // monotonic ns; start of the span being counted; 0: not enabled
    int32_t time = 0;         // seconds credited while the sensor ran at this connection's rate
    int64_t rate = 0;         // of the connection's first enable, in the host's unit
    int64_t onBeginTime = 0;  // monotonic ns; start of the open display-on span; 0: none
    int32_t ontime = 0;       // the credited seconds during which the display was on
    int32_t enableCount = 0;  // enables minus disables
};

/**
 * The connections that registered one sensor. The sensor's current rate is the smallest rate value
 * among the enabled ones. At any moment, time is credited to one connection only, and only to one
 * at the current rate: the report tells who keeps the sensor running fast.
 *
 * Any thread may call any operation. All hold `mLock` throughout, except that `setDisplayState`
 * compares first and `getRegisterConnectionInfo` sorts and formats afterwards. Spans are whole
 * seconds of the monotonic clock, truncated.
 */
class SENSOR_PRIV_EXPORT RegisterConnectionList {
public:
    RegisterConnectionList();
    ~RegisterConnectionList();

    /** Runs `handleEnable` or `handleDisable`. Only an enable has a `rate`. */
    void update(const std::string& pkg, const std::string& opPkg, bool enable, long long rate);

    /**
     * In this order:
     *  1. Credits the first enabled connection of the table that has the current rate.
     *  2. Restarts the spans of all enabled ones. The time of the others is lost.
     *  3. Lowers the current rate to `rate`.
     *  4. Starts the connection, or adds an enable to it. Its first rate stays.
     */
    void handleEnable(const std::string& pkg, const std::string& opPkg, long long rate);

    /**
     * Takes an enable off a known connection, below zero too. With the last one it ends:
     *  - At the current rate: it is credited, the rate is found anew, and the spans of the enabled
     *    ones restart without credit.
     *  - At another rate: nothing is credited.
     */
    void handleDisable(const std::string& pkg, const std::string& opPkg);

    /** Takes the display state; 2 is on. The same one again does nothing. */
    void setDisplayState(int state);

    /**
     * On: starts the display-on spans of the enabled connections. Otherwise: ends them all, and
     * credits the first one of the table that has the current rate.
     */
    void handleDisplayStateChanged();

    /**
     * Takes the ended connections with credited time out of the list. Returns the 50 with the
     * longest time as JSON on one line, or an empty text. The others are dropped.
     */
    std::string getRegisterConnectionInfo();

    /** Whether `a` has the longer credited time. */
    static bool comp(const std::pair<std::string, PkgRegInfo>& a,
                     const std::pair<std::string, PkgRegInfo>& b);

    /** Forgets all connections, enabled ones too. The current rate and the display state stay. */
    void clear();

private:
    using Connections = std::unordered_map<std::string, PkgRegInfo>;

    SENSOR_PRIV_HIDDEN bool isDisplayOn() const;

    Connections mConnections GUARDED_BY(mLock);  // by "pkg/opPkg"
    Mutex mLock;
    int64_t mCurrentRate GUARDED_BY(mLock);  // -1: none

    // -1: none yet. setDisplayState compares and stores it before it locks.
    int mDisplayState;
};

}  // namespace android
