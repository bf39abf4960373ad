#pragma once

#include <cstdint>

namespace android {

/**
 * Reads the decimal number at the start of `text` into `*value`. Blanks and a sign may precede it.
 *  - A number that does not fit 32 bits reads as the nearest one that does.
 *  - Text that does not start with a number leaves `*value` as it was.
 */
void parseInt32(const char* text, int32_t* value);

}  // namespace android
