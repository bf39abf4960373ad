#include "platform/Picture.h"

#include <cerrno>
#include <csetjmp>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <memory>

#include <fcntl.h>
#include <png.h>
#include <sys/stat.h>

namespace platform {

namespace {

/** libpng's state for one file. Errors go to `*error`. */
class PngFile {
public:
    PngFile(std::FILE* file, std::string* error)
          : mPng(png_create_read_struct(PNG_LIBPNG_VER_STRING, error, takeError, ignoreWarning)),
            mInfo(png_create_info_struct(mPng)) {
        png_init_io(mPng, file);
    }

    ~PngFile() { png_destroy_read_struct(&mPng, &mInfo, nullptr); }

    PngFile(const PngFile&) = delete;
    PngFile& operator=(const PngFile&) = delete;

    /** On an error libpng jumps back into this: it may hold no object with a destructor. */
    bool read(Picture* picture) {
        if (setjmp(png_jmpbuf(mPng)) != 0) return false;
        png_read_info(mPng, mInfo);
        picture->width = png_get_image_width(mPng, mInfo);
        picture->height = png_get_image_height(mPng, mInfo);
        if (picture->width > Picture::kMaxSide || picture->height > Picture::kMaxSide) {
            return refuse("a side is longer than 16384 pixels");
        }
        if (uint64_t{picture->width} * picture->height > Picture::kMaxPixels) {
            return refuse("more than 64 million pixels");
        }
        png_set_expand(mPng);
        png_set_scale_16(mPng);
        png_set_gray_to_rgb(mPng);
        png_set_add_alpha(mPng, 0xff, PNG_FILLER_AFTER);
        const int passes = png_set_interlace_handling(mPng);
        png_read_update_info(mPng, mInfo);
        const size_t rowBytes = png_get_rowbytes(mPng, mInfo);
        picture->pixels.resize(rowBytes * picture->height);
        for (int pass = 0; pass < passes; ++pass) {
            for (size_t row = 0; row < picture->height; ++row) {
                png_read_row(mPng, picture->pixels.data() + row * rowBytes, nullptr);
            }
        }
        png_read_end(mPng, nullptr);
        return true;
    }

private:
    [[noreturn]] static void takeError(png_structp png, png_const_charp message) {
        errorOf(png) = std::string("not a sound PNG picture: ") + message;
        png_longjmp(png, 1);
    }

    static std::string& errorOf(png_structp png) {
        return *static_cast<std::string*>(png_get_error_ptr(png));
    }

    bool refuse(const char* what) {
        errorOf(mPng) = what;
        return false;
    }

    static void ignoreWarning(png_structp, png_const_charp) {}

    png_structp mPng;
    png_infop mInfo;
};

}  // namespace

std::optional<std::string> readPng(const std::string& path, Picture* picture) {
    // Not even opened: a pipe would block, and a device may do something.
    struct stat status {};
    if (stat(path.c_str(), &status) == 0 && !S_ISREG(status.st_mode)) return "not a regular file";
    const int fd = open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (fd < 0) return std::string("cannot open: ") + std::strerror(errno);
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(fdopen(fd, "rb"), std::fclose);
    std::string error;
    if (PngFile(file.get(), &error).read(picture)) return std::nullopt;
    return error;
}

}  // namespace platform
