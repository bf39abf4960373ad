#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "report/Table.h"
#include "report/Usage.h"
#include "trace/Origin.h"

namespace report {

inline constexpr int64_t kNsPerDay = 86'400'000'000'000;

/** A day of one boot: the clock starts again with each boot of the device. */
struct Day {
    int64_t boot;    // the first is 0
    int64_t number;  // since the midnight of the clock's 0

    bool operator<(const Day& other) const {
        return boot != other.boot ? boot < other.boot : number < other.number;
    }
};

/** How an app used a sensor on one day; times are nanoseconds. */
struct DayUse {
    std::string app;
    int32_t type = 0;
    int64_t held = 0;
    DisplayTime display;  // within `held`
    int64_t enables = 0;
    std::optional<int64_t> fastest;  // smallest sampling period, ns; nothing: no enable that day
    bool isOpen = false;             // still held when the day, or the replay, ended
};

/** Which app used which sensor, day by day. */
class DayTable {
public:
    /** Adds a slice of boot number `boot`; `usage` knows the display up to its end. */
    void add(int64_t boot, const Slice& slice, const Usage& usage);

    /** The days that have a use, in order. */
    std::vector<Day> days() const;

    /** The uses of a day, the longest held first. */
    std::vector<DayUse> usesOf(const Day& day) const;

private:
    std::map<Day, std::map<std::pair<std::string, int32_t>, DayUse>> mUses;
};

/** The uses as a table of at most `limit` rows. */
Table layOut(const std::vector<DayUse>& uses, const trace::Origin* origin, size_t limit);

}  // namespace report
