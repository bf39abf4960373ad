#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace report {

/** The clock as a person reads it: the day since the boot and the time of that day. */
std::string formatClock(int64_t ns);

/**
 * `text` on one line: a run of blanks and tabs becomes one blank, any other control character,
 * which might move the terminal's cursor, a "?".
 */
std::string onOneLine(std::string_view text);

/** The letter by which logs show a level; "?" for an unknown one. */
char levelLetter(int64_t level);

}  // namespace report
