#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>

#include "capture/dump/StateValue.h"

namespace capture {

/** How the lines of a battery history say when they were written. */
enum class HistoryFormat {
    kSinceStart,  // "+18h39m47s872ms (2) ": time since the first line
    kLocalTime,   // "07-23 12:08:29.838 ": without a year
};

/** A line of a battery history: a command, or a record of what has changed. */
struct HistoryLine {
    enum class Kind { kRecord, kTime, kReset, kStart, kShutdown, kOverflow };

    int64_t prefix;  // milliseconds since the first line, or a YearlessTime
    Kind kind;
    int64_t stamp = 0;  // of kTime and kReset: the local time then

    // Of a record.
    std::array<std::optional<int>, kStates.size()> values{};  // by State
    std::optional<bool> full{};  // whether its status is one at which a plugged device pauses
};

/** Reads a line without blanks around it; nothing if it is none of these. */
std::optional<HistoryLine> parseHistoryLine(std::string_view text, HistoryFormat format);

}  // namespace capture
