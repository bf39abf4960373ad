#include "rgb/ColorAverage.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

// Where the processor may have wider registers than the compiler may count on.
#if defined(__x86_64__) && !defined(SENSOR_PRIV_BASELINE)
#define SENSOR_PRIV_AVX2
#endif

namespace android {

namespace {

static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "a pixel's first byte is its low one");

/** A step of the walk: the bytes of one pixel in the usual formats. */
constexpr size_t kStepBytes = 4;

/** A vector register of that many bytes, each 32-bit lane a pixel. */
template <size_t Bytes>
struct PixelVector {
    typedef uint32_t Type __attribute__((vector_size(Bytes)));
};

/**
 * Sums up `steps` (at least one) of each row; rows begin `rowBytes` apart.
 *
 * In each lane, `all` sums whole pixels and `redBlue` their even bytes. Both are 16-bit sums side
 * by side, so that the even bytes' sums can be read from `redBlue`, and the odd bytes' sums from
 * the difference. 256 pixels fit 16 bits: 256 * 255 < 2^16. What alpha adds leaves the lane at its
 * upper end. Two registers of each keep a processor's adders busy.
 */
template <size_t VectorBytes>
__attribute__((always_inline)) inline ColorAverage sumRows(const uint8_t* base, size_t steps,
                                                           size_t rows, size_t rowBytes) {
    using Vector = typename PixelVector<VectorBytes>::Type;
    constexpr size_t kVectors = 2;
    constexpr size_t kBlockSteps = kVectors * VectorBytes / kStepBytes;
    constexpr size_t kMaxBlocks = 256;

    Vector red = {};
    Vector green = {};
    Vector blue = {};
    ColorAverage sum = {};
    for (size_t row = 0; row < rows; ++row) {
        const uint8_t* next = base + row * rowBytes;
        // The last step is none of a block's: its fourth byte may lie outside the buffer.
        size_t blocks = (steps - 1) / kBlockSteps;
        while (blocks > 0) {
            Vector all[kVectors] = {};
            Vector redBlue[kVectors] = {};
            size_t count = std::min(blocks, kMaxBlocks);
            blocks -= count;
            for (; count > 0; --count) {
                for (size_t i = 0; i < kVectors; ++i) {
                    Vector pixels;
                    std::memcpy(&pixels, next, sizeof(pixels));
                    next += sizeof(pixels);
                    all[i] += pixels;
                    redBlue[i] += pixels & 0x00ff00ff;
                }
            }
            for (size_t i = 0; i < kVectors; ++i) {
                red += redBlue[i] & 0xffff;
                green += (all[i] - redBlue[i]) >> 8 & 0xffff;
                blue += redBlue[i] >> 16;
            }
        }
        for (size_t rest = (steps - 1) % kBlockSteps + 1; rest > 0; --rest, next += kStepBytes) {
            sum.red += next[0];
            sum.green += next[1];
            sum.blue += next[2];
        }
    }
    for (size_t lane = 0; lane < VectorBytes / sizeof(uint32_t); ++lane) {
        sum.red += red[lane];
        sum.green += green[lane];
        sum.blue += blue[lane];
    }
    return sum;
}

#ifdef SENSOR_PRIV_AVX2
__attribute__((target("avx2"))) ColorAverage sumRowsAvx2(const uint8_t* base, size_t steps,
                                                         size_t rows, size_t rowBytes) {
    return sumRows<32>(base, steps, rows, rowBytes);
}
#endif

ColorAverage sumRows(const uint8_t* base, size_t steps, size_t rows, size_t rowBytes) {
#ifdef SENSOR_PRIV_AVX2
    if (__builtin_cpu_supports("avx2")) return sumRowsAvx2(base, steps, rows, rowBytes);
#endif
    return sumRows<16>(base, steps, rows, rowBytes);
}

}  // namespace

ColorAverage averageColor(const void* base, uint32_t width, uint32_t height, uint32_t stride,
                          PixelFormat format) {
    const uint32_t count = width * height;
    const uint32_t pixelBytes = bytesPerPixel(format);
    const uint32_t length = pixelBytes * width;
    if (count == 0 || length == 0 || length > INT32_MAX) return {};

    size_t steps = (size_t{length} + kStepBytes - 1) / kStepBytes;
    size_t rows = height;
    const size_t rowBytes = pixelBytes * stride;
    if (steps * kStepBytes == rowBytes) {  // rows without gaps are one row
        steps *= rows;
        rows = 1;
    }
    const ColorAverage sum = sumRows(static_cast<const uint8_t*>(base), steps, rows, rowBytes);
    return {sum.red / count, sum.green / count, sum.blue / count};
}

}  // namespace android
