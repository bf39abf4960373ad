#include "rgb/ColorAverage.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

// Where the processor may have wider registers than the compiler assumes.
#if defined(__x86_64__) && !defined(SENSOR_PRIV_BASELINE)
#define SENSOR_PRIV_AVX2
#endif

namespace android {

namespace {

static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "a pixel's first byte is its low one");

/** A step of the walk: the bytes of one pixel in the usual formats. */
constexpr size_t kStepBytes = 4;

/** What there is to average. Only `rowBytes` may be 0. */
struct Walk {
    const uint8_t* base;
    size_t steps;  // of each row
    size_t rows;
    size_t rowBytes;  // from one row's begin to the next one's
    uint32_t count;   // of pixels; the divisor
};

/** A vector register of that many bytes. Each 32-bit lane holds a pixel. */
template <size_t Bytes>
struct PixelVector {
    typedef uint32_t Type __attribute__((vector_size(Bytes)));
};

/**
 * In each lane, `all` sums whole pixels and `redBlue` their even bytes. Each holds two 16-bit sums
 * side by side. The even bytes' sums are in `redBlue`, the odd bytes' sums in the difference.
 *  - A sum of 256 pixels fits 16 bits: 256 * 255 < 2^16.
 *  - The sum of alpha overflows at the lane's upper end and is lost.
 *  - Two registers of each keep a processor's adders busy.
 */
template <size_t VectorBytes>
__attribute__((always_inline)) inline void average(const Walk& walk, int32_t* rgb) {
    using Vector = typename PixelVector<VectorBytes>::Type;
    constexpr size_t kVectors = 2;
    constexpr size_t kBlockSteps = kVectors * VectorBytes / kStepBytes;
    constexpr size_t kMaxBlocks = 256;

    Vector reds = {};
    Vector greens = {};
    Vector blues = {};
    uint32_t red = 0;
    uint32_t green = 0;
    uint32_t blue = 0;
    for (size_t row = 0; row < walk.rows; ++row) {
        const uint8_t* next = walk.base + row * walk.rowBytes;
        // The last step belongs to no block: its fourth byte may lie outside the buffer.
        size_t blocks = (walk.steps - 1) / kBlockSteps;
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
                reds += redBlue[i] & 0xffff;
                greens += (all[i] - redBlue[i]) >> 8 & 0xffff;
                blues += redBlue[i] >> 16;
            }
        }
        for (size_t rest = (walk.steps - 1) % kBlockSteps + 1; rest > 0; --rest) {
            red += next[0];
            green += next[1];
            blue += next[2];
            next += kStepBytes;
        }
    }
    for (size_t lane = 0; lane < VectorBytes / sizeof(uint32_t); ++lane) {
        red += reds[lane];
        green += greens[lane];
        blue += blues[lane];
    }
    rgb[0] = static_cast<int32_t>(red / walk.count);
    rgb[1] = static_cast<int32_t>(green / walk.count);
    rgb[2] = static_cast<int32_t>(blue / walk.count);
}

#ifdef SENSOR_PRIV_AVX2
__attribute__((target("avx2"))) void averageAvx2(const Walk& walk, int32_t* rgb) {
    average<32>(walk, rgb);
}
#endif

}  // namespace

void averageColor(const void* base, uint32_t width, uint32_t height, uint32_t stride,
                  PixelFormat format, int32_t* rgb) {
    const uint32_t count = width * height;
    const uint32_t pixelBytes = bytesPerPixel(format);
    const uint32_t length = pixelBytes * width;
    const uint32_t rowBytes = pixelBytes * stride;
    if (count == 0 || length == 0 || length > INT32_MAX) {
        rgb[0] = rgb[1] = rgb[2] = 0;
        return;
    }
    Walk walk = {static_cast<const uint8_t*>(base), (size_t{length} + kStepBytes - 1) / kStepBytes,
                 height, rowBytes, count};
    if (walk.steps * kStepBytes == walk.rowBytes) {  // rows without gaps are one row
        walk.steps *= walk.rows;
        walk.rows = 1;
    }
#ifdef SENSOR_PRIV_AVX2
    if (__builtin_cpu_supports("avx2")) return averageAvx2(walk, rgb);
#endif
    average<16>(walk, rgb);
}

}  // namespace android
