#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "base/Calendar.h"

namespace trace {

using base::kNsPerMs;

/** 285 years. The clock and every wait that the Looper can ask for still fit 63 bits. */
inline constexpr int64_t kMaxTimeMs = 9'000'000'000'000;

/**
 * Reads `token`, a valid JSON number of milliseconds, as nanoseconds. Blanks may follow it. Returns
 * nothing for a negative time, one over `kMaxTimeMs`, or one that is no whole nanosecond.
 */
std::optional<int64_t> parseMs(std::string_view token);

}  // namespace trace
