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

/** What is known of one connection's use of the orientation sensors. Times are in seconds. */
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
 * Measures how long the orientation-type sensors (sensor types 3, orientation, and 11, rotation
 * vector) are enabled, and how much of that while the phone charges, by kind of charging: charge
 * states 1 (fast), 2 (USB) and 3 (other); any other state is not charging. `SDCImpl` calls it.
 *
 * All connections together: running totals, kept in "persist.sys.*_oriut" and reported as
 * "N273|10012" once for each new value of the host's day counter. They are never reset.
 * Each connection by itself: a table, not persisted, reported once a day under the same event id.
 *
 * All operations may be called from any thread. `mPkgLock` guards the table and is held for it
 * only; the totals and the state are not locked (see the members). Times are read from the
 * monotonic clock; spans count as whole seconds, truncated. Numbers wrap at 32 bits. State changes
 * are logged at debug level while `mLogSwitch` is on.
 */
class SENSOR_PRIV_EXPORT MagneticUseIf {
public:
    /** The single instance, created by the first call. Locks `sLock`. */
    static MagneticUseIf* getInstance();

    MagneticUseIf();

    // What the host tells.

    /**
     * Takes the charge state. A new one decides whether the phone charges and, if so, the kind that
     * time is booked to from then on. Every one, also one that is not new, then goes through
     * `dealWithChargeForPkgInfo` and `dealWithChargeAndOrientationEnableState`.
     */
    void sendChargeState(int state);

    /**
     * 1, the device has booted: posts the load of the totals. Any other state, it is going down:
     * posts their store, unless no boot was ever seen, as the totals were then never loaded.
     */
    void sendBootShutdownRebootState(int state);

    /**
     * Takes the host's day counter. The days since the highest one so far are added to the days of
     * the totals; a value that is not higher adds none.
     */
    void sendUsedTime(int uds);

    /**
     * A connection was enabled, or disabled: counts it, then runs
     * `dealWithOrientationEnableDisable`, `dealWithChargeAndOrientationEnableState` and
     * `dealWithOrientationTotalTime`, in this order. The `pkg` of the disable that takes the count
     * from 1 to 0 is the one that the report names, unless it is empty, cut at 1023 bytes.
     *
     * Surplus disables take the count below 0, and it is set back only when an enabled span closes:
     * if they come while none is open, the next enables start no span until the count is 1 again.
     */
    void setOrientationEnable(std::string pkg, std::string opPkg);
    void setOrientationDisable(std::string pkg, std::string opPkg);

    /** Posts the daily report of the connections. */
    void notifyDayNight();

    /**
     * Forgets all connections, enabled ones too, at once, on the caller's thread: before a report
     * that is still posted. The totals stay.
     */
    void notifyMagReset();

    /**
     * Adds `seconds`, its low 32 bits, to a total: 1 fast, 2 USB, 3 other charging, 4 shock and
     * charge, 5 all enabled time, after which `calCurretTime(pkg)` follows. Other numbers: nothing.
     */
    void calCurretUseTotalTime(std::string pkg, long seconds, int bucket);

    // The steps of these.

    /**
     * Brings the connections that are enabled in line with the charge state. Charging: restarts
     * their charge spans and drops what had run up. Not charging: books the spans but leaves their
     * begin, so that the same again books the same time again. A connection whose span never began
     * is booked the whole monotonic time, if there has been charging at all.
     */
    void dealWithChargeForPkgInfo();

    /**
     * Opens the charging-and-enabled span, or closes it by `recordTime`, as charge state and count
     * have it. A change from one kind of charging to another does neither: all of the span goes to
     * the kind in force when it closes.
     */
    void dealWithChargeAndOrientationEnableState();

    /**
     * Enable: restarts the span of the connection pkg/opPkg, crediting the one that is open, and
     * adds an enable. Disable: takes an enable from a connection that is enabled and, with the last
     * one, credits and ends its span; others are ignored. Charge time is booked where time is
     * credited, while the phone charges. Locks `mPkgLock`.
     */
    void dealWithOrientationEnableDisable(std::string pkg, std::string opPkg, bool enable);

    /**
     * Opens the enabled span, or closes it as the count has it. Closing adds its seconds to the
     * total, runs `calCurretTime` for the last package, and sets a count below 0 to 0.
     */
    void dealWithOrientationTotalTime();

    /**
     * Books the charging-and-enabled span up to now to the last kind of charging, unless it was
     * shorter than a second.
     */
    void recordTime();

    /**
     * If the day counter is past its value at the last report: brings the days of the totals to it,
     * back too if the counter went back, and reports the totals.
     */
    void calCurretTime(std::string pkg);

    /** Sends the report of the totals, which names `pkg`, and posts their store. */
    void setOrientationTally(std::string pkg);

    /**
     * Replaces each total by the stored one, 0 if it is unset; what is no number leaves the total
     * as it was. Time counted since the start of the process is lost.
     */
    void getPersistStatistics();

    /** Stores all totals. */
    void setPersistStatistics();

    /**
     * Takes the connections that are not enabled out of the table and reports the 50 with the
     * longest time, if there are any; the rest of them are dropped. `mPkgLock` is released before
     * the list is made.
     */
    void recordPkgInfoTally();

    /**
     * Books the seconds from the record's `chargeBeginTime` to `now`, monotonic ns, to the last
     * kind of charging. For a record of the table `mPkgLock` must be held.
     */
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
