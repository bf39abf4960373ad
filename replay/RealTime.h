#pragma once

#include <cstdint>

#include <time.h>

#include "base/Calendar.h"

namespace replay {

/** The time that passes outside of a replay, ns; the monotonic clock is the replay's. */
inline int64_t realTime() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC_RAW, &now);
    return int64_t{now.tv_sec} * base::kNsPerSecond + now.tv_nsec;
}

}  // namespace replay
