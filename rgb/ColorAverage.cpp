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

#define ALWAYS_INLINE __attribute__((always_inline)) inline

/** A vector register of that many bytes. Each 32-bit lane holds a pixel. */
template <size_t Bytes>
struct PixelVector {
    typedef uint32_t Type __attribute__((vector_size(Bytes)));
};

/**
 * In each lane, `all` sums whole pixels and `redBlue` their even bytes. Each holds two 16-bit sums
 * side by side. The even bytes' sums are in `redBlue`, the odd bytes' sums in the difference. The
 * sum of alpha overflows at the lane's upper end and is lost.
 */
template <typename Vector>
struct PixelSums {
    static constexpr size_t kMaxVectors = 256;  // 256 * 255 < 2^16

    Vector all = {};
    Vector redBlue = {};

    ALWAYS_INLINE void add(const Vector& pixels) {
        all += pixels;
        redBlue += pixels & 0x00ff00ff;
    }

    ALWAYS_INLINE void addNext(const uint8_t** next) {
        Vector pixels;
        std::memcpy(&pixels, *next, sizeof(pixels));
        *next += sizeof(pixels);
        add(pixels);
    }
};

/** The sums of each colour, in each lane. */
template <typename Vector>
struct ColorSums {
    Vector red = {};
    Vector green = {};
    Vector blue = {};

    /** Takes what `*sums` holds and leaves it empty. */
    ALWAYS_INLINE void take(PixelSums<Vector>* sums) {
        red += sums->redBlue & 0xffff;
        green += (sums->all - sums->redBlue) >> 8 & 0xffff;
        blue += sums->redBlue >> 16;
        *sums = {};
    }
};

template <typename Vector>
ALWAYS_INLINE uint32_t total(const Vector& lanes) {
    uint32_t sum = 0;
    for (size_t lane = 0; lane < sizeof(lanes) / sizeof(sum); ++lane) sum += lanes[lane];
    return sum;
}

/** From its element n on, this is a mask for the upper n lanes of a register with 8. */
constexpr size_t kMaxLanes = 8;
constexpr uint32_t kUpperLanes[2 * kMaxLanes] = {0,   0,   0,   0,   0,   0,   0,   0,
                                                 ~0u, ~0u, ~0u, ~0u, ~0u, ~0u, ~0u, ~0u};

/**
 * Loads the last `count` steps of a row, from 1 to the number of lanes. The lanes below are 0.
 * `end` lies behind the last step, whose fourth byte may lie outside the buffer. So the register
 * ends with the third byte, and each lane begins with the byte before its step.
 */
template <typename Vector>
ALWAYS_INLINE void loadLast(const uint8_t* end, size_t count, Vector* pixels) {
    constexpr size_t kLanes = sizeof(Vector) / kStepBytes;
    Vector mask;
    std::memcpy(&mask, kUpperLanes + kMaxLanes - kLanes + count, sizeof(mask));
    std::memcpy(pixels, end - 1 - sizeof(*pixels), sizeof(*pixels));
    *pixels = *pixels >> 8 & mask;
}

/** Sums the rows of a walk. Two registers of each kind keep a processor's adders busy. */
template <typename Vector>
class RowSums {
public:
    ALWAYS_INLINE RowSums() {}  // not defaulted: g++ would clear all of it in memory, slowly

    ALWAYS_INLINE void addRow(const uint8_t* next, size_t steps) {
        const uint8_t* const end = next + steps * kStepBytes;
        if (steps > kLanes) {
            next = addVectors(next, (steps - 1) / kLanes);
            Vector last;
            loadLast(end, static_cast<size_t>(end - next) / kStepBytes, &last);
            mSecond.add(last);
            return;
        }
        for (; next < end; next += kStepBytes) {
            for (size_t color = 0; color < 3; ++color) mShort[color] += next[color];
        }
    }

    ALWAYS_INLINE void divide(uint32_t count, int32_t* rgb) {
        takeSums();
        rgb[0] = static_cast<int32_t>((total(mSums.red) + mShort[0]) / count);
        rgb[1] = static_cast<int32_t>((total(mSums.green) + mShort[1]) / count);
        rgb[2] = static_cast<int32_t>((total(mSums.blue) + mShort[2]) / count);
    }

private:
    static constexpr size_t kLanes = sizeof(Vector) / kStepBytes;

    /** Leaves room for one more in the second register. */
    ALWAYS_INLINE const uint8_t* addVectors(const uint8_t* next, size_t vectors) {
        while (vectors > 0) {
            if (mRoom < 2) takeSums();
            const size_t count = std::min(vectors, 2 * (mRoom - 1));
            for (size_t pairs = count / 2; pairs > 0; --pairs) {
                mFirst.addNext(&next);
                mSecond.addNext(&next);
            }
            if (count % 2 != 0) mFirst.addNext(&next);
            mRoom -= count / 2 + 1;
            vectors -= count;
        }
        return next;
    }

    ALWAYS_INLINE void takeSums() {
        mSums.take(&mFirst);
        mSums.take(&mSecond);
        mRoom = mFirst.kMaxVectors;
    }

    PixelSums<Vector> mFirst;
    PixelSums<Vector> mSecond;
    ColorSums<Vector> mSums;
    size_t mRoom = mFirst.kMaxVectors;  // for how many more in mFirst, and in mSecond
    uint32_t mShort[3] = {};            // of rows shorter than a register
};

template <size_t VectorBytes>
ALWAYS_INLINE void average(const Walk& walk, int32_t* rgb) {
    RowSums<typename PixelVector<VectorBytes>::Type> sums;
    for (size_t row = 0; row < walk.rows; ++row) {
        sums.addRow(walk.base + row * walk.rowBytes, walk.steps);
    }
    sums.divide(walk.count, rgb);
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
