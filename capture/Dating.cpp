#include "capture/Dating.h"

#include <algorithm>

#include "capture/dump/WallTime.h"

namespace capture {

namespace {

/** For each line: the midnights since the oldest that the printed times show. */
std::vector<int64_t> countMidnights(const std::vector<DumpLine>& lines) {
    std::vector<int64_t> midnights(lines.size(), 0);
    for (size_t i = 1; i < lines.size(); ++i) {
        const int64_t fall = lines[i - 1].registration.timeOfDay - lines[i].registration.timeOfDay;
        midnights[i] = midnights[i - 1] + (fall > kMsPerHour ? 1 : 0);
    }
    return midnights;
}

/** The last day on which `timeOfDay` is not after `taken`. */
int64_t lastDay(int64_t timeOfDay, int64_t taken) {
    return wholeUnits(taken - timeOfDay, kMsPerDay);
}

/**
 * For each dump: the day that its lines' midnights count from. An older dump cannot count from a
 * later day than a newer one; a dump without a date counts as its neighbour does.
 */
std::vector<std::optional<int64_t>> baseDays(const JoinedLines& joined,
                                             const std::vector<int64_t>& midnights,
                                             const std::vector<std::optional<int64_t>>& taken) {
    std::vector<std::optional<int64_t>> days(joined.dumps.size());
    std::optional<int64_t> base;
    for (size_t i = days.size(); i-- > 0;) {
        const JoinedDump& dump = joined.dumps[i];
        if (const auto& date = taken[dump.dump]) {
            const int64_t timeOfDay = joined.lines[dump.last].registration.timeOfDay;
            const int64_t day = lastDay(timeOfDay, *date) - midnights[dump.last];
            base = std::min(base.value_or(day), day);
        }
        days[i] = base;
    }
    for (size_t i = 1; i < days.size(); ++i) {
        if (!days[i]) days[i] = days[i - 1];
    }
    return days;
}

}  // namespace

Dating dateLines(const JoinedLines& joined, const std::vector<std::optional<int64_t>>& taken) {
    const std::vector<int64_t> midnights = countMidnights(joined.lines);
    const auto bases = baseDays(joined, midnights, taken);
    Dating dating;
    dating.firstDay = bases.front();
    size_t dump = 0;  // the first that holds the line
    for (size_t i = 0; i < joined.lines.size(); ++i) {
        while (joined.dumps[dump].last < i) ++dump;
        const int64_t skipped = bases[dump].value_or(0) - bases.front().value_or(0);
        const int64_t time =
                (midnights[i] + skipped) * kMsPerDay + joined.lines[i].registration.timeOfDay;
        dating.printed.push_back(time);
        const int64_t before = dating.times.empty() ? 0 : dating.times.back();
        if (time < before) dating.setBack.push_back(i);
        dating.times.push_back(std::max(time, before));
    }
    return dating;
}

}  // namespace capture
