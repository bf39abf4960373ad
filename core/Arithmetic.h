#pragma once

#include <cstdint>
#include <limits>

namespace android {

/** `total` plus the low 32 bits of `amount`, wrapping at 2^32 as the device's counters do. */
constexpr int32_t addWrapped(int32_t total, int64_t amount) {
    return static_cast<int32_t>(static_cast<uint32_t>(total) + static_cast<uint32_t>(amount));
}

/** Whole seconds from `begin` to `end`, both in nanoseconds, truncated toward zero. */
constexpr int64_t secondsBetween(int64_t begin, int64_t end) {
    return (end - begin) / 1'000'000'000;
}

/** `value` truncated toward zero; the nearest 32-bit number if it does not fit, 0 for a NaN. */
constexpr int32_t truncated(float value) {
    constexpr float kEnd = 2147483648.0F;  // the first that is too large
    if (value >= kEnd) return std::numeric_limits<int32_t>::max();
    if (value <= -kEnd) return std::numeric_limits<int32_t>::min();
    return value == value ? static_cast<int32_t>(value) : 0;
}

}  // namespace android
