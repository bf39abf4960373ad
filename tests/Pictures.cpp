#include "tests/Pictures.h"

#include <algorithm>
#include <random>

platform::Picture randomPicture(uint32_t width, uint32_t height, unsigned seed) {
    std::mt19937 random(seed);
    platform::Picture picture{width, height, std::vector<uint8_t>(size_t{4} * width * height)};
    for (uint8_t& byte : picture.pixels) byte = static_cast<uint8_t>(random());
    return picture;
}

std::array<int, 3> averageOf(const platform::Picture& picture, const std::array<int, 4>& rect) {
    const auto [left, top, right, bottom] = rect;
    std::array<int64_t, 3> sums{};
    for (int y = std::max(top, 0); y < std::min<int>(bottom, picture.height); ++y) {
        for (int x = std::max(left, 0); x < std::min<int>(right, picture.width); ++x) {
            for (size_t i = 0; i < 3; ++i) {
                sums[i] += picture.pixels[4 * (size_t{picture.width} * y + x) + i];
            }
        }
    }
    const int64_t count = int64_t{right - left} * (bottom - top);
    return {static_cast<int>(sums[0] / count), static_cast<int>(sums[1] / count),
            static_cast<int>(sums[2] / count)};
}
