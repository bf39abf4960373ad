#pragma once

#include <cstdint>
#include <string>
#include <unordered_map>
#include <utility>

#include <utils/Mutex.h>

#include "core/Export.h"

namespace android {

/** What is known of one connection, an app's use of one of the two motion sensors. */
struct PkgRegInfo {
    int64_t beginTime = 0;    // monotonic ns; start of the span being counted; 0: not enabled
    int32_t time = 0;         // seconds credited while the sensor ran at this connection's rate
    int64_t rate = 0;         // of the connection's first enable, in the host's unit
    int64_t onBeginTime = 0;  // monotonic ns; start of the open display-on span; 0: none
    int32_t ontime = 0;       // the credited seconds during which the display was on
    int32_t enableCount = 0;  // enables minus disables
};

/**
 * The connections that registered one sensor, and the rate that it runs at: the smallest rate value
 * of the enabled ones. Time is credited only to a connection whose own rate is that rate, and at
 * any moment to one of them only, so that a report tells who keeps the sensor running fast.
 *
 * All operations may be called from any thread and hold `mLock` throughout, but for the comparison
 * in `setDisplayState` and the sorting and formatting of `getRegisterConnectionInfo`. Times are
 * read from the monotonic clock before the lock is taken; spans count as whole seconds, truncated.
 */
class SENSOR_PRIV_EXPORT RegisterConnectionList {
public:
    RegisterConnectionList();
    ~RegisterConnectionList();

    /** `handleEnable`, or `handleDisable`, to which `rate` means nothing. */
    void update(const std::string& pkg, const std::string& opPkg, bool enable, long long rate);

    /**
     * Credits the first enabled connection, in the table's order, that holds the current rate;
     * restarts the spans of all enabled ones, the others' time being lost; lowers the current rate
     * to `rate`; then starts the connection pkg/opPkg or, if it is known, adds an enable to it. The
     * rate of its first enable stays.
     */
    void handleEnable(const std::string& pkg, const std::string& opPkg, long long rate);

    /**
     * Takes an enable from the connection, below zero too. When none is left it ends: credited if
     * it holds the current rate, in which case that rate is found anew and the spans of those still
     * enabled restart without credit; else with nothing. Unknown connections are ignored.
     */
    void handleDisable(const std::string& pkg, const std::string& opPkg);

    /** Takes a new display state: 2 is on, any other is not. The same one again does nothing. */
    void setDisplayState(int state);

    /**
     * Display on: starts the display-on span of every enabled connection. Otherwise ends all of
     * them, crediting the first one, in the table's order, that holds the current rate.
     */
    void handleDisplayStateChanged();

    /**
     * Takes the ended connections with credited time out of the list and returns the 50 with the
     * longest as JSON text on one line; the rest of them are dropped. Empty if there are none.
     */
    std::string getRegisterConnectionInfo();

    /** Whether `a` has the longer credited time. */
    static bool comp(const std::pair<std::string, PkgRegInfo>& a,
                     const std::pair<std::string, PkgRegInfo>& b);

    /**
     * Forgets all connections, enabled ones too. The current rate and the display state stay, so
     * that a rate which nobody holds any more may keep others from being credited.
     */
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
