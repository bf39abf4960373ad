#pragma once

#include <array>
#include <cstdint>

#include "platform/Picture.h"

/** A picture of noise, the same for the same seed. */
platform::Picture randomPicture(uint32_t width, uint32_t height, unsigned seed);

/** The average colour of a rectangle, as left, top, right, bottom. What is outside is black. */
std::array<int, 3> averageOf(const platform::Picture& picture, const std::array<int, 4>& rect);
