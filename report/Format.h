#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace report {

/** A duration in nanoseconds as h:mm:ss; parts of a second are left out. */
std::string formatDuration(int64_t ns);

/** The time of day of a moment, in nanoseconds from any midnight, as "11:45:07". */
std::string formatTimeOfDay(int64_t ns);

/** The clock as a person reads it: the day since the boot and the time of that day. */
std::string formatClock(int64_t ns);

/**
 * `text` on one line: a run of blanks and tabs becomes one blank, any other control character,
 * which might move the terminal's cursor, a "?".
 */
std::string onOneLine(std::string_view text);

/** The texts one behind another, with `between` between two. */
std::string join(const std::vector<std::string>& texts, std::string_view between = ", ");

/** The letter by which logs show a level; "?" for an unknown one. */
char levelLetter(int64_t level);

}  // namespace report
