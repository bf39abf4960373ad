#pragma once

#include <cstdint>

#include <time.h>

namespace replay {

/** The time that passes outside of a replay, ns; the monotonic clock is the replay's. */
inline int64_t realTime() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC_RAW, &now);
    return int64_t{now.tv_sec} * 1'000'000'000 + now.tv_nsec;
}

}  // namespace replay
