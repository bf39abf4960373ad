#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace report {

inline constexpr size_t kWidth = 100;  // columns of what is made for a terminal, at most

/**
 * `text`, which comes from outside, for a terminal: what is not UTF-8 becomes U+FFFD, control
 * characters and those that turn the direction of writing become "?".
 */
std::string safe(std::string_view text);

/** The columns that `text`, made by `safe`, takes on a terminal. */
size_t width(std::string_view text);

/** `text`, made by `safe`, in at most `columns` columns: too long, it loses its middle. */
std::string cut(const std::string& text, size_t columns);

/** `text` as HTML shows it: none of it is markup. */
std::string escape(std::string_view text);

/** `ns` as h:mm:ss; parts of a second are left out. */
std::string formatDuration(int64_t ns);

/** A sampling period in nanoseconds as a rate in Hz; "fastest" for a period of 0 or less. */
std::string formatRate(int64_t periodNs);

/** A day, in days since 1970-01-01, as "2018-04-25". */
std::string formatDate(int64_t day);

/** The time of day of `ns`, nanoseconds since a midnight, as "11:42:21". */
std::string formatTimeOfDay(int64_t ns);

}  // namespace report
