#pragma once

#include <cstdint>
#include <limits>

namespace android {

/** A counter that must not wrap rises only while it is at most this: it stops one higher. */
constexpr int32_t kLastCounted = 2'147'483'645;

/** `total` plus the low 32 bits of `amount`. Wraps at 2^32, as the device's counters do. */
constexpr int32_t addWrapped(int32_t total, int64_t amount) {
    return static_cast<int32_t>(static_cast<uint32_t>(total) + static_cast<uint32_t>(amount));
}

/** The whole seconds from `begin` to `end`, both in nanoseconds. Truncates toward zero. */
constexpr int64_t secondsBetween(int64_t begin, int64_t end) {
    return (end - begin) / 1'000'000'000;
}

/** Adds the whole seconds from `begin` to `end`, both in nanoseconds, to `*seconds`. May wrap. */
constexpr void addSeconds(int32_t* seconds, int64_t begin, int64_t end) {
    *seconds = addWrapped(*seconds, secondsBetween(begin, end));
}

/**
 * `value` truncated toward zero, as the device's processor does it: a value out of range gives the
 * nearest 32-bit number, a NaN gives 0.
 */
constexpr int32_t truncateToInt32(float value) {
    using Limits = std::numeric_limits<int32_t>;
    if (value >= 0x1p31f) return Limits::max();
    if (value >= -0x1p31f) return static_cast<int32_t>(value);
    return value < 0 ? Limits::min() : 0;
}

}  // namespace android
