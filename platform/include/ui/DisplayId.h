#pragma once

#include <stdint.h>

namespace android {

/** A display that is built in or plugged in, the same over boots. */
struct PhysicalDisplayId {
    uint64_t value;
};

}  // namespace android
