#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "capture/DumpJoin.h"
#include "capture/dump/WallTime.h"

namespace capture {

/** When registrations that print a time of day only were made. */
struct Dating {
    std::optional<int64_t> firstDay;  // of the oldest line, in days since 1970; time 0 is its start
    std::vector<int64_t> times;       // of the lines: milliseconds since that midnight
    std::vector<int64_t> printed;     // the same, by the printed times alone
    std::vector<size_t> setBack;      // lines that keep the time of the line before them

    /** A wall time on the trace's clock. There must be a first day. */
    int64_t traceTime(int64_t wallTime) const { return wallTime - *firstDay * kMsPerDay; }

    /** The reverse. */
    int64_t wallTime(int64_t traceTime) const { return traceTime + *firstDay * kMsPerDay; }
};

/**
 * Dates lines. `taken[d]`: upper bound of dump d's times, if one is known.
 *
 * A fall of the time of day by more than an hour is a midnight; a smaller one is a clock that was
 * set back. The dumps' own dates show where whole days are missing between two dumps.
 */
Dating dateLines(const JoinedLines& joined, const std::vector<std::optional<int64_t>>& taken);

}  // namespace capture
