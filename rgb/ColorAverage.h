#pragma once

#include <cstdint>

#include <ui/PixelFormat.h>

namespace android {

/**
 * Averages the first three bytes of each pixel into `rgb`: red, green, blue. A row has `width`
 * pixels of `format`, and rows begin `stride` pixels apart, the first one at `base`.
 *  - Each row is read in steps of 4 bytes, whatever the format. A last step that only begins within
 *    the row counts. No byte after its third one is read.
 *  - The sums wrap at 2^32. Each is divided by `width` * `height`, which wraps too, and truncated.
 *  - The averages are 0 if that product is 0, or if a row has no bytes or 2^31 and more.
 *
 * Any thread may call it. It takes no lock and no memory.
 */
void averageColor(const void* base, uint32_t width, uint32_t height, uint32_t stride,
                  PixelFormat format, int32_t* rgb);

}  // namespace android
