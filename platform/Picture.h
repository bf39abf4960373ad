#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace platform {

/** Pixels row by row, 4 bytes each: red, green, blue, alpha. */
struct Picture {
    static constexpr uint32_t kMaxSide = 16384;         // pixels
    static constexpr uint64_t kMaxPixels = 64'000'000;  // that is 256 MB

    uint32_t width = 0;
    uint32_t height = 0;
    std::vector<uint8_t> pixels;
};

/**
 * Reads the PNG file `path` into `*picture`. Every PNG format is taken:
 *  - Samples keep their stored values. Gamma and colour profiles are ignored.
 *  - Samples of other depths are scaled to 8 bits.
 *  - Alpha is not multiplied in. Pixels without alpha are opaque.
 *
 * Refuses what is no regular file, and pictures beyond the limits above. Returns nothing, or what
 * is wrong; `*picture` is then not to be used. Throws `std::bad_alloc`.
 */
std::optional<std::string> readPng(const std::string& path, Picture* picture);

}  // namespace platform
