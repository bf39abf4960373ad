#include "platform/Picture.h"

#include <cstdio>
#include <fstream>

#include <gtest/gtest.h>
#include <png.h>
#include <sys/stat.h>

#include "tests/TestFolder.h"

namespace {

using Bytes = std::vector<uint8_t>;

/** A kind of PNG picture. */
struct Format {
    int colorType;
    int bits;  // of a sample
    int interlace = PNG_INTERLACE_NONE;
};

constexpr int kGray = PNG_COLOR_TYPE_GRAY;
constexpr int kRgb = PNG_COLOR_TYPE_RGB;
constexpr int kPalette = PNG_COLOR_TYPE_PALETTE;
constexpr int kAdam7 = PNG_INTERLACE_ADAM7;

/**
 * Writes a picture whose rows are `rows`, one after another as PNG packs them; without rows, it
 * ends where they should begin. `hides`: the colour or the palette entry 1 is transparent. All say
 * a gamma.
 */
void writePng(const std::string& file, const Format& format, uint32_t width, uint32_t height,
              Bytes rows, bool hides = false) {
    std::FILE* out = std::fopen(file.c_str(), "wb");
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    png_init_io(png, out);
    png_set_IHDR(png, info, width, height, format.bits, format.colorType, format.interlace,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_set_gAMA(png, info, 1.0);
    const png_color palette[] = {{10, 20, 30}, {40, 50, 60}, {70, 80, 90}};
    if (format.colorType == kPalette) png_set_PLTE(png, info, palette, 3);
    const png_byte alphas[] = {255, 7};
    const png_color_16 hidden{0, 1, 1, 1, 1};
    if (hides) png_set_tRNS(png, info, alphas, 2, &hidden);
    png_write_info(png, info);
    const int passes = png_set_interlace_handling(png);
    for (int pass = 0; pass < passes && !rows.empty(); ++pass) {
        for (size_t y = 0; y < height; ++y) {
            png_write_row(png, rows.data() + y * rows.size() / height);
        }
    }
    if (rows.empty()) {
        std::fwrite("\0\0\1\0IDAT", 1, 8, out);
    } else {
        png_write_end(png, nullptr);
    }
    png_destroy_write_struct(&png, &info);
    std::fclose(out);
}

class PictureTest : public ::testing::Test {
protected:
    std::string read(platform::Picture* picture) const {
        return platform::readPng(mFile, picture).value_or("");
    }

    const TestFolder mFolder;
    const std::string mFile = mFolder / "a.png";
};

TEST_F(PictureTest, EveryFormatBecomesEightBitsOfRedGreenBlueAndAlpha) {
    const struct {
        Format format;
        uint32_t width, height;
        Bytes rows;
        Bytes pixels;
        bool hides = false;
    } kPictures[] = {
            {{PNG_COLOR_TYPE_RGBA, 8}, 2, 1, {9, 8, 7, 1, 5, 6, 7, 0}, {9, 8, 7, 1, 5, 6, 7, 0}},
            {{kRgb, 8}, 1, 2, {9, 8, 7, 200, 3, 4}, {9, 8, 7, 255, 200, 3, 4, 255}},
            {{kRgb, 8}, 2, 1, {1, 1, 1, 1, 1, 2}, {1, 1, 1, 0, 1, 1, 2, 255}, true},
            {{PNG_COLOR_TYPE_GA, 8}, 2, 1, {9, 1, 200, 0}, {9, 9, 9, 1, 200, 200, 200, 0}},
            {{kGray, 8}, 2, 1, {0, 77}, {0, 0, 0, 255, 77, 77, 77, 255}},
            {{kGray, 8}, 2, 1, {1, 2}, {1, 1, 1, 0, 2, 2, 2, 255}, true},
            {{kGray, 1}, 2, 1, {0x40}, {0, 0, 0, 255, 255, 255, 255, 255}},
            {{kGray, 2}, 2, 1, {0x60}, {85, 85, 85, 255, 170, 170, 170, 255}},
            {{kGray, 4}, 2, 1, {0x1f}, {17, 17, 17, 255, 255, 255, 255, 255}},
            {{kPalette, 8}, 2, 1, {2, 1}, {70, 80, 90, 255, 40, 50, 60, 255}},
            {{kPalette, 2}, 3, 1, {0x18}, {10, 20, 30, 255, 40, 50, 60, 7, 70, 80, 90, 255}, true},
            // 16 bits are rounded, not cut.
            {{kGray, 16}, 2, 1, {0x12, 0x34, 0x00, 0xff}, {18, 18, 18, 255, 1, 1, 1, 255}},
            {{kRgb, 16}, 1, 1, {0, 128, 0, 129, 255, 255}, {0, 1, 255, 255}},
            {{kGray, 8, kAdam7}, 3, 3, {1, 2, 3, 4, 5, 6, 7, 8, 9}, {1, 1, 1, 255, 2, 2, 2, 255,
                                                                     3, 3, 3, 255, 4, 4, 4, 255,
                                                                     5, 5, 5, 255, 6, 6, 6, 255,
                                                                     7, 7, 7, 255, 8, 8, 8, 255,
                                                                     9, 9, 9, 255}},
    };
    for (const auto& [format, width, height, rows, pixels, hides] : kPictures) {
        SCOPED_TRACE(::testing::Message() << "type " << format.colorType << ", " << format.bits
                                          << " bits, transparency: " << hides);
        writePng(mFile, format, width, height, rows, hides);
        platform::Picture picture;
        EXPECT_EQ(read(&picture), "");
        EXPECT_EQ(picture.width, width);
        EXPECT_EQ(picture.height, height);
        EXPECT_EQ(picture.pixels, pixels);
    }
}

TEST_F(PictureTest, IsReadOnlyUpToItsLimits) {
    constexpr char kTooLong[] = "a side is longer than 16384 pixels";
    constexpr char kTooMany[] = "more than 64 million pixels";
    constexpr char kTorn[] = "not a sound PNG picture: Read Error";  // there are no rows
    const struct {
        uint32_t width, height;
        const char* error;
    } kSizes[] = {{16384, 1, kTorn},       {16385, 1, kTooLong},   {1, 16385, kTooLong},
                  {1, 16384, kTorn},       {8001, 8000, kTooMany}, {16384, 16384, kTooMany},
                  {16384, 3907, kTooMany}, {8000, 8000, kTorn}};
    for (const auto& [width, height, error] : kSizes) {
        writePng(mFile, {kGray, 1}, width, height, {});
        platform::Picture picture;
        EXPECT_EQ(read(&picture), error) << width << " x " << height;
    }
}

TEST_F(PictureTest, WhatIsNoPictureIsNamed) {
    platform::Picture picture;
    EXPECT_EQ(read(&picture), "cannot open: No such file or directory");
    std::ofstream(mFile) << "no picture at all";
    EXPECT_EQ(read(&picture), "not a sound PNG picture: Not a PNG file");
    writePng(mFile, {kGray, 8}, 64, 64, Bytes(size_t{64} * 64, 3));
    std::filesystem::resize_file(mFile, std::filesystem::file_size(mFile) - 20);
    EXPECT_EQ(read(&picture).rfind("not a sound PNG picture: ", 0), 0u) << read(&picture);
    writePng(mFile, {kGray, 8}, 1, 1, {3});
    std::filesystem::resize_file(mFile, std::filesystem::file_size(mFile) - 12);  // its last chunk
    EXPECT_EQ(read(&picture), "not a sound PNG picture: Read Error");
    ASSERT_EQ(mkfifo((mFolder / "pipe").c_str(), 0600), 0);
    for (const std::string& path : {mFolder / "pipe", mFolder / "", std::string("/dev/zero")}) {
        EXPECT_EQ(platform::readPng(path, &picture), "not a regular file") << path;
    }
}

}  // namespace
