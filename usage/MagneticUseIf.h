#pragma once

#include <cstdint>
#include <string>
#include <unordered_map>
#include <utility>

#include <cutils/properties.h>
#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"
#include "core/SharedText.h"

namespace android {

/** One connection's use of the orientation sensors. Times are seconds unless they say otherwise. */
struct PkgInfo {
    int64_t beginTime = 0;        // monotonic ns; start of the open span; 0: not enabled
    int64_t chargeBeginTime = 0;  // monotonic ns; start of the charge span; kept when it ends
    int32_t fastChargeTime = 0;   // booked to charge state 1
    int32_t usbChargeTime = 0;    // booked to charge state 2
    int32_t otherChargeTime = 0;  // booked to charge state 3
    int32_t totalTime = 0;        // enabled, whatever the charge state
    int32_t enableCount = 0;      // enables minus disables
};

/**
 * Measures how long the orientation and the rotation vector sensor are enabled, and how much of
 * that the phone charges. Charge state 1 is fast charging, 2 USB, 3 other; any other state is not
 * charging. `SDCImpl` calls it.
 *  - Totals of all connections are kept in "persist.sys.*_oriut". They are reported as "N273|10012"
 *    once for each new value of the host's day counter, and never reset.
 *  - A table has each connection's times. It is not stored, and reported daily as "N273|10012".
 *
 * Any thread may call any operation. `mPkgLock` guards the table only; nothing else is locked.
 * Spans are whole seconds of the monotonic clock, truncated. Numbers wrap at 32 bits. While
 * `mLogSwitch` is not 0, state changes are logged.
 */
class SENSOR_PRIV_EXPORT MagneticUseIf {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static MagneticUseIf* getInstance();

    MagneticUseIf();

    /**
     * Takes the charge state. A new one decides whether the phone charges, and to which kind time
     * is booked. Every one then runs `dealWithChargeForPkgInfo` and
     * `dealWithChargeAndOrientationEnableState`.
     */
    void sendChargeState(int state);

    /** 1 (booted): posts the load of the totals. Any other: posts their save if a boot was seen. */
    void sendBootShutdownRebootState(int state);

    /** Takes the day counter. Adds the days since its highest value so far to the totals. */
    void sendUsedTime(int uds);

    /**
     * A connection was enabled or disabled. Counts that, then runs
     * `dealWithOrientationEnableDisable`, `dealWithChargeAndOrientationEnableState` and
     * `dealWithOrientationTotalTime`.
     *  - The totals' report names the `pkg` of the last disable that took the count from 1 to 0,
     *    unless that is empty. It cuts the name after 1023 bytes.
     *  - Surplus disables while no span is open take the count below 0. Then the next enables open
     *    no span until the count is 1.
     */
    void setOrientationEnable(std::string pkg, std::string opPkg);
    void setOrientationDisable(std::string pkg, std::string opPkg);

    /** Posts the daily report of the connections. */
    void notifyDayNight();

    /** Empties the table on the caller's thread, enabled connections too. The totals stay. */
    void notifyMagReset();

    /**
     * Adds the low 32 bits of `seconds` to a total. `bucket` 1, 2 and 3 are the kinds of charging,
     * 4 is shock and charge, 5 all enabled time, which also runs `calCurretTime`. Other: nothing.
     */
    void calCurretUseTotalTime(std::string pkg, long seconds, int bucket);

    /**
     * Applies the charge state to the enabled connections.
     *  - Charging: restarts their charge spans without booking them.
     *  - Not charging: books each span but keeps its begin, so a repeat books it again. A span that
     *    never began is booked as the whole monotonic time, if the phone ever charged.
     */
    void dealWithChargeForPkgInfo();

    /**
     * Opens the charging-and-enabled span, or closes it and runs `recordTime`. Another kind of
     * charging does neither, so the whole span goes to the kind in force when it closes.
     */
    void dealWithChargeAndOrientationEnableState();

    /**
     * Updates the connection in the table. Locks `mPkgLock`.
     *  - Enable: credits an open span, starts a new one and adds an enable.
     *  - Disable: takes an enable off; the last one credits and ends the span. Connections that are
     *    not enabled are ignored.
     *  - While the phone charges, crediting a span books its charge time too.
     */
    void dealWithOrientationEnableDisable(std::string pkg, std::string opPkg, bool enable);

    /** Opens the enabled span, or closes it: adds it to the total and runs `calCurretTime`. */
    void dealWithOrientationTotalTime();

    /** Books the charging-and-enabled span to the last kind of charging, from 1 s on. */
    void recordTime();

    /** If the day counter has risen since the last report: sets the days to it and reports. */
    void calCurretTime(std::string pkg);

    /** Reports the totals with `pkg` and posts their save. */
    void setOrientationTally(std::string pkg);

    /**
     * Loads the totals; what was counted since the start of the process is lost. A total that is
     * not stored becomes 0. A stored text that is no number leaves the total as it was.
     */
    void getPersistStatistics();

    /** Stores all totals. */
    void setPersistStatistics();

    /**
     * Takes the connections that are not enabled out of the table and reports the 50 with the
     * longest time. The others are dropped. Without any: no report.
     */
    void recordPkgInfoTally();

    /** Books the charge span up to `now`, in ns, to the last charge kind. Needs `mPkgLock`. */
    void updateChargeTime(std::unordered_map<std::string, PkgInfo>::iterator it, long long now);

    /** Whether `a` has the longer time. */
    static bool comp(const std::pair<std::string, PkgInfo>& a,
                     const std::pair<std::string, PkgInfo>& b);

    /** `value` in decimal. */
    std::string convertLongToString(long value);
    std::string convertIntToString(int value);

private:
    class MagneticUseIfHandler;

    /** A running total: the property that keeps it, and its key in the report. */
    struct Total {
        const char* property;
        const char* key;
        int32_t MagneticUseIf::*value;
    };
    SENSOR_PRIV_HIDDEN static const Total kTotals[6];

    SENSOR_PRIV_HIDDEN void logTotals(const char* verb) const;

    // Up to the table, members are shared by the host's threads and the worker without a lock, on
    // purpose: a load that runs while the host's call adds to a total may overwrite what it added.

    int mEnableNumbers = 0;       // enables minus disables of all connections
    int mCurrentPCState = 0;      // charge state, the last one
    int mLastPCState = 0;         // charge state, the last that was new
    bool mIsChargeState = false;  // that state is a kind of charging

    // The charging-and-enabled span; times are monotonic ns, 0 while there is none.
    bool mBeginCountTime = false;  // it is open
    int64_t mBeginTime = 0;
    int64_t mEndTime = 0;

    SharedText mLastPkg;  // what the report names

    // The enabled span; times are monotonic ns, 0 while there is none.
    bool mTotalBeginCountTime = false;  // it is open
    int64_t mTotalBeginTime = 0;
    int64_t mTotalEndTime = 0;

    char mPropValue[PROPERTY_VALUE_MAX] = {};  // the load's buffer
    int mChargeType = 0;  // the last kind of charging, also after it has ended; 0: none so far

    // The totals, in seconds.
    int32_t mZunoFastChargeUT = 0;
    int32_t mUsbChargeUT = 0;
    int32_t mOtherChargeUT = 0;
    int32_t mShockAndChargeUT = 0;
    int32_t mTotalOrientationUT = 0;
    int32_t mTotalD = 0;  // this one in days

    bool mBooted = false;  // a boot was seen; never cleared

    // Of the host's day counter.
    int mUD = 0;       // its last value
    int mLastUD = 0;   // its value up to which `mTotalD` has come
    int mLastRUD = 0;  // its value at the last report

    // Constant after construction.
    const sp<MagneticUseIfHandler> mHandler;

    std::unordered_map<std::string, PkgInfo> mPkgInfoMap GUARDED_BY(mPkgLock);  // by "pkg/opPkg"
    Mutex mPkgLock;

    static Mutex sLock;
    static MagneticUseIf* mMagneticUseIf GUARDED_BY(sLock);
};

}  // namespace android
