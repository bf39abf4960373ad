#pragma once

#include <cstdint>
#include <map>
#include <set>
#include <vector>

#include "day/Use.h"

namespace day {

/** The host's hour 23: the library's daily report, or the reset that empties its lists. */
struct DailyCall {
    int64_t boot;
    int64_t at;  // ns
    bool isReset;
};

/** Why a use earned no report, or less than its time; in the order in which they are told. */
enum class Cause {
    kStillOn,     // at the daily report, whose reset wiped it
    kUnseenEnd,   // the library was told of no end
    kNoReport,    // came after the use
    kWiped,       // by a reset that came before the report
    kSlower,      // than another app's rate, at which the sensor ran
    kSameRate,    // as another app's; time at one rate counts for one app only
    kFirstRate,   // the app's, which counts until it is reported, is not the one that it asked for
    kStaleRate,   // the sensor's rate stands for nobody any more
    kTogether,    // with other uses of the same app, which count as one
    kTooShort,    // less than a second at a time
    kBeyondList,  // the report has no room for it
    kShortProximity,  // only long uses are reported
    kOpenProximity,   // only uses that end are reported
    kSystemApp,       // whose proximity is not reported
    kNobodyWatches,   // the sensor
};

/** The uses that each cause concerns. */
using Causes = std::map<Cause, std::set<const Use*>>;

/**
 * Why the times of `uses` differ from those that the device reports. `calls` are in order. The
 * result points into `uses`.
 */
Causes findCauses(const std::vector<Use>& uses, const std::vector<DailyCall>& calls);

}  // namespace day
