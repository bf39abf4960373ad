#pragma once

#include <cstdint>

#include <ui/PixelFormat.h>

namespace android {

/**
 * Averages the first three bytes of each pixel of a buffer into `rgb`: red, green and blue. `base`
 * is the buffer's first byte, `width` and `stride` are in pixels, and a row begins every `stride`
 * pixels of `format`.
 *
 * A row is walked in steps of 4 bytes, whatever the format, up to its length of `width` pixels: a
 * format of another size is taken for bytes, and a last step that only begins within the row counts
 * whole. A row of 2^31 bytes or more counts as empty. The sums wrap at 2^32; each is divided by
 * `width` times `height`, which wraps likewise, and truncated. If that product is 0, so are the
 * averages.
 *
 * Reads no byte behind the third one of any row's last step. May be called from any thread; takes
 * no lock and no memory.
 */
void averageColor(const void* base, uint32_t width, uint32_t height, uint32_t stride,
                  PixelFormat format, int32_t* rgb);

}  // namespace android
