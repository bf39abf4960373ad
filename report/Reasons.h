#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "report/Usage.h"
#include "trace/Origin.h"

namespace report {

/** A slice, and the boot in which it was. */
struct BootSlice {
    int64_t boot;
    Slice slice;
};

/** A daily report of the host's hour 23, and its reset: when, and in which boot. */
struct DailyTick {
    int64_t boot;
    int64_t at;  // nanoseconds
};

/** Why times differ, and whom it concerns: apps, or sensors that nobody watches. */
struct Reason {
    std::string text;
    std::vector<std::string> names;  // each once, in order
};

/**
 * Why the times for which sensors were held differ from those that the device reports: each reason
 * that occurs, once.
 */
std::vector<Reason> explainDifferences(const std::vector<BootSlice>& slices,
                                       const std::vector<DailyTick>& reports,
                                       const trace::Origin* origin);

}  // namespace report
