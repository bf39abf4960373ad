#include "bench/PlainAverage.h"

android::ColorAverage averagePlainly(const uint8_t* row, uint32_t width, uint32_t height,
                                     uint32_t stride) {
    android::ColorAverage sum = {};
    for (uint32_t y = 0; y < height; ++y, row += 4 * stride) {
        for (uint32_t x = 0; x < width; ++x) {
            sum.red += row[4 * x];
            sum.green += row[4 * x + 1];
            sum.blue += row[4 * x + 2];
        }
    }
    const uint32_t count = width * height;
    return {sum.red / count, sum.green / count, sum.blue / count};
}
