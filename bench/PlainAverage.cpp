#include "bench/PlainAverage.h"

void averagePlainly(const uint8_t* row, uint32_t width, uint32_t height, uint32_t stride,
                    int32_t* rgb) {
    uint32_t red = 0;
    uint32_t green = 0;
    uint32_t blue = 0;
    for (uint32_t y = 0; y < height; ++y, row += 4 * stride) {
        for (uint32_t x = 0; x < width; ++x) {
            red += row[4 * x];
            green += row[4 * x + 1];
            blue += row[4 * x + 2];
        }
    }
    const uint32_t count = width * height;
    rgb[0] = static_cast<int32_t>(red / count);
    rgb[1] = static_cast<int32_t>(green / count);
    rgb[2] = static_cast<int32_t>(blue / count);
}
