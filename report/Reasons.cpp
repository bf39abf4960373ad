#include "report/Reasons.h"

#include <algorithm>
#include <cstddef>
#include <map>
#include <set>

#include "report/SensorNames.h"

namespace report {

namespace {

/** Who watches a sensor, and so what becomes of the time for which it is held. */
enum class Watch { kNobody, kAccelerometer, kGyroscope, kOrientation, kProximity };

Watch watchOf(int32_t type) {
    switch (type) {
        case SENSOR_TYPE_ACCELEROMETER:
        case SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED:
            return Watch::kAccelerometer;
        case SENSOR_TYPE_GYROSCOPE:
        case SENSOR_TYPE_GYROSCOPE_UNCALIBRATED:
            return Watch::kGyroscope;
        case SENSOR_TYPE_ORIENTATION:
        case SENSOR_TYPE_ROTATION_VECTOR:
            return Watch::kOrientation;
        case SENSOR_TYPE_PROXIMITY:
            return Watch::kProximity;
        default:
            return Watch::kNobody;
    }
}

// In the order in which they are told.
enum Cause {
    kStillOn,
    kNoReport,
    kSlower,
    kSameRate,
    kShortProximity,
    kNobodyWatches,
};

constexpr const char* kTexts[] = {
        "still on at the daily report, so not in it, and wiped by its reset",
        "no daily report came after the use",
        ("time counts only at the rate that the sensor runs at, and another app asked for a faster "
         "one"),
        "time at one rate counts for one app only, and another app had the same rate",
        "proximity is reported only for uses of more than 30 minutes, and not for system apps",
        "nobody watches the sensor",
};

constexpr int64_t kReportedProximityNs = 1'800'000'000'000;

/** What each reason concerns, each once, in order. */
using Findings = std::map<Cause, std::set<std::string>>;

bool runsAtRates(Watch watch) {
    return watch == Watch::kAccelerometer || watch == Watch::kGyroscope;
}

/** The reason that one slice has by itself. */
void judge(const BootSlice& each, const std::vector<DailyTick>& reports,
           const trace::Origin* origin, Findings* findings) {
    const Slice& slice = each.slice;
    const Watch watch = watchOf(slice.type);
    if (watch == Watch::kNobody) {
        (*findings)[kNobodyWatches].insert(nameSensor(slice.type, origin));
    } else if (watch == Watch::kProximity) {
        if (slice.to - slice.from < kReportedProximityNs + 1'000'000'000) {
            (*findings)[kShortProximity].insert(slice.app);
        }
    } else {
        const auto next =
                std::find_if(reports.begin(), reports.end(), [&](const DailyTick& report) {
                    return report.boot == each.boot && report.at >= slice.from;
                });
        if (next == reports.end()) {
            (*findings)[kNoReport].insert(slice.app);
        } else if (slice.to > next->at || slice.isOpen) {
            (*findings)[kStillOn].insert(slice.app);
        }
    }
}

/** Compares two slices of one sensor that overlap. */
void compare(const Slice& a, const Slice& b, Findings* findings) {
    if (a.app == b.app) return;
    const int64_t periodA = a.enables.front().periodNs;
    const int64_t periodB = b.enables.front().periodNs;
    if (periodA == periodB) {
        (*findings)[kSameRate].insert(a.app);
        (*findings)[kSameRate].insert(b.app);
    } else {
        (*findings)[kSlower].insert(periodA > periodB ? a.app : b.app);
    }
}

/** Compares each slice with those that were open when it began. */
void compareOverlaps(const std::vector<BootSlice>& slices, Findings* findings) {
    std::vector<const BootSlice*> sorted;
    for (const BootSlice& each : slices) {
        if (runsAtRates(watchOf(each.slice.type))) sorted.push_back(&each);
    }
    std::sort(sorted.begin(), sorted.end(), [](const BootSlice* a, const BootSlice* b) {
        return a->boot != b->boot ? a->boot < b->boot : a->slice.from < b->slice.from;
    });
    std::vector<const BootSlice*> open;
    for (const BootSlice* each : sorted) {
        open.erase(std::remove_if(open.begin(), open.end(),
                                  [&](const BootSlice* other) {
                                      return other->boot != each->boot ||
                                             other->slice.to <= each->slice.from;
                                  }),
                   open.end());
        for (const BootSlice* other : open) {
            if (watchOf(other->slice.type) == watchOf(each->slice.type)) {
                compare(other->slice, each->slice, findings);
            }
        }
        open.push_back(each);
    }
}

}  // namespace

std::vector<Reason> explainDifferences(const std::vector<BootSlice>& slices,
                                       const std::vector<DailyTick>& reports,
                                       const trace::Origin* origin) {
    Findings findings;
    for (const BootSlice& each : slices) judge(each, reports, origin, &findings);
    compareOverlaps(slices, &findings);
    std::vector<Reason> reasons;
    for (const auto& [cause, names] : findings) {
        reasons.push_back({kTexts[cause], {names.begin(), names.end()}});
    }
    return reasons;
}

}  // namespace report
