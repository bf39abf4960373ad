#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace trace {

inline constexpr int64_t kNsPerMs = 1'000'000;

/** 285 years. The clock and every wait that the Looper can ask for still fit 63 bits. */
inline constexpr int64_t kMaxTimeMs = 9'000'000'000'000;

/**
 * Reads `token`, a valid JSON number of milliseconds, as nanoseconds. Blanks may follow it. Returns
 * nothing for a negative time, one over `kMaxTimeMs`, or one that is no whole nanosecond.
 */
std::optional<int64_t> parseMs(std::string_view token);

/** The time `ns` in milliseconds, in decimal, with as many decimals as it needs. */
std::string formatMs(int64_t ns);

}  // namespace trace
