#include "trace/TraceTime.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <cstring>

namespace trace {

namespace {

constexpr int64_t kDecimals = 6;    // of a millisecond
constexpr int64_t kMaxDigits = 19;  // of a time in nanoseconds

}  // namespace

std::optional<int64_t> parseMs(std::string_view token) {
    // Digit by digit: a double does not hold the nanoseconds of a year.
    std::string digits;
    int64_t exponent = kDecimals;  // the time is `digits` times ten to this
    size_t i = 0;
    for (bool fraction = false; i < token.size() && std::strchr("-.0123456789", token[i]); ++i) {
        if (token[i] == '.') fraction = true;
        if (token[i] < '0') continue;
        if (token[i] != '0' || !digits.empty()) digits += token[i];
        if (fraction) --exponent;
    }
    if (digits.empty()) return 0;
    if (token.front() == '-') return std::nullopt;
    if (i < token.size()) {  // an exponent, or blanks, which read as 0
        const std::string rest(token.substr(i + 1));
        exponent += std::clamp(std::strtol(rest.c_str(), nullptr, 10), -1000L, 1000L);
    }
    for (; digits.back() == '0'; ++exponent) digits.pop_back();
    if (exponent < 0 || static_cast<int64_t>(digits.size()) + exponent > kMaxDigits) {
        return std::nullopt;
    }
    digits.append(static_cast<size_t>(exponent), '0');
    const int64_t time = std::strtoll(digits.c_str(), nullptr, 10);
    return time <= kMaxTimeMs * kNsPerMs ? std::optional(time) : std::nullopt;
}

}  // namespace trace
