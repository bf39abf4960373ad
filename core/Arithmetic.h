#pragma once

#include <cstdint>
#include <limits>

namespace android {

/** `total` plus the low 32 bits of `amount`, wrapping at 2^32 as the device's counters do. */
constexpr int32_t addWrapped(int32_t total, int64_t amount) {
    return static_cast<int32_t>(static_cast<uint32_t>(total) + static_cast<uint32_t>(amount));
}

/** Counters that must not wrap are raised up to one past this number, and then stay there. */
constexpr int32_t kLastCounted = 2'147'483'645;

/** Whole seconds from `begin` to `end`, both in nanoseconds, truncated toward zero. */
constexpr int64_t secondsBetween(int64_t begin, int64_t end) {
    return (end - begin) / 1'000'000'000;
}

/** Adds the whole seconds from `begin` to `end`, in nanoseconds, to a 32-bit count of seconds. */
constexpr void addSeconds(int32_t* seconds, int64_t begin, int64_t end) {
    *seconds = addWrapped(*seconds, secondsBetween(begin, end));
}

/**
 * `value` truncated toward zero. What does not fit 32 bits gives the nearest number that does, a
 * NaN 0, as the device's processor has it.
 */
constexpr int32_t truncateToInt32(float value) {
    using Limits = std::numeric_limits<int32_t>;
    if (value >= 0x1p31f) return Limits::max();
    if (value >= -0x1p31f) return static_cast<int32_t>(value);
    return value < 0 ? Limits::min() : 0;
}

}  // namespace android
