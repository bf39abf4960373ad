#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace platform {

/** A picture's pixels row by row, 4 bytes each: red, green, blue, alpha. */
struct Picture {
    /** Largest side and largest area, in pixels. */
    static constexpr uint32_t kMaxSide = 16384;
    static constexpr uint64_t kMaxPixels = 64'000'000;

    uint32_t width = 0;
    uint32_t height = 0;
    std::vector<uint8_t> pixels;
};

/**
 * Reads the PNG file `path` into `*picture`. Its pixels are taken as they are stored: no gamma, no
 * colour profile, and alpha (opaque, if there is none) not multiplied in; deeper samples are scaled
 * to 8 bits. Returns nothing, or what is wrong with the file; `*picture` is then not to be used.
 */
std::optional<std::string> readPng(const std::string& path, Picture* picture);

}  // namespace platform
