#pragma once

#include <stdint.h>

namespace android::ui {

/** Pixels. Invalid by default. */
struct Size {
    int32_t width = -1;
    int32_t height = -1;
};

}  // namespace android::ui
