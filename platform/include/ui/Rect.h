#pragma once

#include <stdint.h>

namespace android {

/** A rectangle of pixels. Right and bottom are exclusive. Invalid by default. */
class Rect {
public:
    int32_t left = 0;
    int32_t top = 0;
    int32_t right = -1;
    int32_t bottom = -1;

    Rect() = default;
    Rect(int32_t l, int32_t t, int32_t r, int32_t b) : left(l), top(t), right(r), bottom(b) {}

    int32_t getWidth() const { return right - left; }
    int32_t getHeight() const { return bottom - top; }
    bool isValid() const { return getWidth() >= 0 && getHeight() >= 0; }
    bool isEmpty() const { return getWidth() <= 0 || getHeight() <= 0; }
};

}  // namespace android
