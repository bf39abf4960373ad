#include "rgb/ColorAverage.h"

#include <algorithm>
#include <array>
#include <random>
#include <vector>

#include <gtest/gtest.h>
#include <sys/mman.h>

namespace android {
namespace {

/** Memory between two pages that must not be touched. */
class GuardedMemory {
public:
    explicit GuardedMemory(size_t size)
          : mSize((size + kPage - 1) / kPage * kPage),
            mPages(static_cast<uint8_t*>(mmap(nullptr, mSize + 2 * kPage, PROT_NONE,
                                              MAP_PRIVATE | MAP_ANONYMOUS, -1, 0))) {
        mprotect(begin(), mSize, PROT_READ | PROT_WRITE);
    }

    ~GuardedMemory() { munmap(mPages, mSize + 2 * kPage); }

    GuardedMemory(const GuardedMemory&) = delete;
    GuardedMemory& operator=(const GuardedMemory&) = delete;

    uint8_t* begin() const { return mPages + kPage; }
    uint8_t* end() const { return begin() + mSize; }

private:
    static constexpr size_t kPage = 4096;

    const size_t mSize;
    uint8_t* const mPages;
};

using Rgb = std::array<int32_t, 3>;

Rgb average(const void* base, uint32_t width, uint32_t height, uint32_t stride,
            PixelFormat format) {
    Rgb rgb;
    averageColor(base, width, height, stride, format, rgb.data());
    return rgb;
}

/** The walk, byte by byte. */
Rgb averagePlainly(const uint8_t* row, uint32_t width, uint32_t height, uint32_t stride,
                   PixelFormat format) {
    uint32_t sums[3] = {};
    const uint32_t rowBytes = bytesPerPixel(format) * stride;
    const auto length = static_cast<int32_t>(bytesPerPixel(format) * width);
    for (uint32_t y = 0; y < height; ++y, row += rowBytes) {
        for (int32_t offset = 0; offset < length; offset += 4) {
            for (int i = 0; i < 3; ++i) sums[i] += row[offset + i];
        }
    }
    const uint32_t count = width * height;
    if (count == 0) return {};
    Rgb rgb{};
    for (size_t i = 0; i < rgb.size(); ++i) rgb[i] = static_cast<int32_t>(sums[i] / count);
    return rgb;
}

TEST(ColorAverageTest, AgreesWithThePlainWalkAndReadsNoByteThatItDoesNot) {
    constexpr PixelFormat kFormats[] = {PIXEL_FORMAT_RGBA_8888, PIXEL_FORMAT_BGRA_8888,
                                        PIXEL_FORMAT_RGB_888,   PIXEL_FORMAT_RGB_565,
                                        PIXEL_FORMAT_RGBA_FP16, /*no bytes*/ 33};
    constexpr size_t kMaxBytes = 8 * 6400 + 64;
    const GuardedMemory memory(kMaxBytes);
    std::mt19937 random(1);
    const auto below = [&](size_t limit) { return static_cast<uint32_t>(random() % limit); };
    std::generate(memory.begin(), memory.end(), [&] { return static_cast<uint8_t>(random()); });
    for (int round = 0; round < 4000; ++round) {
        const PixelFormat format = kFormats[below(std::size(kFormats))];
        const uint32_t width = 1 + below(round % 4 == 0 ? 6400 : 80);
        const uint32_t stride = width + (round % 2) * below(40);
        const uint32_t height = 1 + below(6400 / stride + (stride > 6400 ? 1 : 0));
        if (round % 100 == 0) std::fill(memory.begin(), memory.end(), 0xff);
        if (stride * height > 6400) continue;
        // All that the walk reads, up to the third byte of its last step.
        const size_t pixelBytes = bytesPerPixel(format);
        const size_t last = pixelBytes * (height - 1) * stride + (pixelBytes * width + 3) / 4 * 4;
        const uint8_t* const atEnd = memory.end() - (pixelBytes == 0 ? 0 : last - 1);
        for (const uint8_t* base : {atEnd, static_cast<const uint8_t*>(memory.begin())}) {
            ASSERT_EQ(average(base, width, height, stride, format),
                      averagePlainly(base, width, height, stride, format))
                    << width << " x " << height << " of " << stride << ", format " << format;
        }
    }
}

TEST(ColorAverageTest, SumsWrapAt32Bits) {
    // A stride of 0 shows the same row over and over.
    const std::vector<uint8_t> row(size_t{4} * 65536, 0xff);
    const uint32_t sum = 65536u * 300u * 255u;
    const auto mean = static_cast<int32_t>(sum / (65536 * 300));
    EXPECT_EQ(average(row.data(), 65536, 300, 0, PIXEL_FORMAT_RGBA_8888), (Rgb{mean, mean, mean}));
}

TEST(ColorAverageTest, NothingToReadIsBlack) {
    const struct {
        uint32_t width;
        uint32_t height;
        PixelFormat format;
    } kCases[] = {
            {0, 5, PIXEL_FORMAT_RGBA_8888},
            {5, 0, PIXEL_FORMAT_RGBA_8888},
            {65536, 65536, PIXEL_FORMAT_RGBA_8888},  // 2^32 pixels count as none
            {5, 5, 0},
            {0x20000000, 1, PIXEL_FORMAT_RGBA_8888},  // rows of 2^31 bytes
            {0x30000000, 3, PIXEL_FORMAT_RGBA_8888},
            {0x18000000, 1, PIXEL_FORMAT_RGBA_FP16},
    };
    const GuardedMemory memory(1);
    for (const auto& [width, height, format] : kCases) {
        EXPECT_EQ(average(memory.end(), width, height, width, format), Rgb{})
                << width << " x " << height << ", format " << format;
    }
}

TEST(ColorAverageTest, TruncatesAndIgnoresAlphaAndPadding) {
    const uint8_t pixels[] = {255, 0, 0,   255, 7, 7, 7, 7,  //
                              0,   0, 255, 0};
    EXPECT_EQ(average(pixels, 1, 2, 2, PIXEL_FORMAT_RGBA_8888), (Rgb{127, 0, 127}));
}

}  // namespace
}  // namespace android
