#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace record {

// Each appends to `out`. None depends on the locale or takes a lock.

/** `text` as a JSON string in ASCII. A byte that is not UTF-8 becomes U+FFFD. */
void appendText(std::string* out, std::string_view text);

/** `text` as `appendText` writes it, without the quotes. */
void appendEscaped(std::string* out, std::string_view text);

void appendInteger(std::string* out, int64_t value);

/** `ns` nanoseconds as milliseconds, with as many decimals as they need. */
void appendMs(std::string* out, int64_t ns);

/**
 * `value` with as few digits as give the same `float` again. JSON has no infinity, which is written
 * as a number that reads as one, and no NaN, which is written as 0.
 */
void appendFloat(std::string* out, float value);

}  // namespace record
