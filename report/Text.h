#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace report {

/**
 * `text`, which comes from outside, for a terminal: what is not UTF-8 becomes U+FFFD, control
 * characters and those that turn the direction of writing become "?".
 */
std::string safe(std::string_view text);

/** The columns that `text`, made by `safe`, takes on a terminal. */
size_t width(std::string_view text);

/** `text`, made by `safe`, in at most `columns` columns: too long, it loses its middle. */
std::string cut(const std::string& text, size_t columns);

/**
 * `text`, made by `safe`, as lines of at most `columns` columns: broken at blanks. A longer word
 * loses its middle.
 */
std::vector<std::string> wrap(const std::string& text, size_t columns);

/** `text` as HTML shows it: none of it is markup. */
std::string escape(std::string_view text);

/** A rate in Hz. */
std::string formatHertz(double rate);

/** A sampling period in nanoseconds as a rate in Hz; "fastest" for a period of 0 or less. */
std::string formatRate(int64_t periodNs);

}  // namespace report
