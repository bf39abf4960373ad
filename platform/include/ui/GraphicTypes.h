#pragma once

#include <stdint.h>
#include <system/graphics.h>

namespace android::ui {

enum class PixelFormat : int32_t {
    RGBA_8888 = HAL_PIXEL_FORMAT_RGBA_8888,
    RGBX_8888 = HAL_PIXEL_FORMAT_RGBX_8888,
    RGB_888 = HAL_PIXEL_FORMAT_RGB_888,
    RGB_565 = HAL_PIXEL_FORMAT_RGB_565,
    BGRA_8888 = HAL_PIXEL_FORMAT_BGRA_8888,
    RGBA_FP16 = HAL_PIXEL_FORMAT_RGBA_FP16,
    RGBA_1010102 = HAL_PIXEL_FORMAT_RGBA_1010102,
};

enum class Dataspace : int32_t {
    UNKNOWN = HAL_DATASPACE_UNKNOWN,
    V0_SRGB = HAL_DATASPACE_V0_SRGB,
};

}  // namespace android::ui
