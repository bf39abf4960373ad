#pragma once

#include <cstdint>

/** `averageColor` of 4-byte pixels as one would write it down, compiled with -O2. */
void averagePlainly(const uint8_t* row, uint32_t width, uint32_t height, uint32_t stride,
                    int32_t* rgb);
