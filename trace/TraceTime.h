#pragma once

#include <cstdint>
#include <string>

namespace trace {

inline constexpr int64_t kNsPerMs = 1'000'000;

/** The time `ns` in milliseconds, in decimal, with as many decimals as it needs. */
std::string formatMs(int64_t ns);

}  // namespace trace
