#include "platform/Display.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <mutex>
#include <new>

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

namespace platform {

namespace {

constexpr size_t kPixelBytes = 4;

/** The display, without the pixels of a picture. */
struct State {
    DisplaySize size = {1080, 2400};
    Color color = {};
    bool showsPicture = false;
    uint32_t rowPadding = 0;
    DisplayFault fault = DisplayFault::kNone;
};

std::optional<std::string> noMemory(const char* what, int error) {
    return std::string("no memory for ") + what + ": " + std::strerror(error);
}

/** A picture's pixels, in memory that forked processes share. Maps only as much as is shown. */
class Pixels {
public:
    /** Makes the memory, which is empty. Returns false, with `errno`, if that fails. */
    bool create() {
        if (mFd < 0) mFd = memfd_create("display", MFD_CLOEXEC);
        return mFd >= 0;
    }

    std::optional<std::string> show(const std::vector<uint8_t>& pixels) {
        if (!create()) return noMemory("a picture", errno);
        // Reserved now: a lack of memory at the first touch would be a signal.
        if (const int error = posix_fallocate(mFd, 0, static_cast<off_t>(pixels.size()))) {
            return noMemory("a picture", error);
        }
        if (!map(pixels.size())) return noMemory("a picture", errno);
        std::memcpy(mPixels, pixels.data(), pixels.size());
        // Gives back what a larger picture had.
        return ftruncate(mFd, static_cast<off_t>(pixels.size())) == 0
                       ? std::nullopt
                       : noMemory("a picture", errno);
    }

    /** Maps the first `bytes`. Returns false, with `errno`, if that fails. */
    bool map(size_t bytes) {
        if (bytes <= mMapped) return true;
        void* memory = mmap(nullptr, bytes, PROT_READ | PROT_WRITE, MAP_SHARED, mFd, 0);
        if (memory == MAP_FAILED) return false;
        if (mPixels != nullptr) munmap(mPixels, mMapped);
        mPixels = static_cast<uint8_t*>(memory);
        mMapped = bytes;
        return true;
    }

    const uint8_t* data() const { return mPixels; }

private:
    int mFd = -1;
    uint8_t* mPixels = nullptr;
    size_t mMapped = 0;  // bytes
};

/** Never destroyed: captures may read it until the process ends. */
struct Display {
    std::mutex mutex;  // between this process's threads; guards the rest
    State own;
    State* state = &own;  // `own`, or in memory that forked processes share
    Pixels pixels;

    bool map() {
        return !state->showsPicture ||
               pixels.map(kPixelBytes * state->size.width * state->size.height);
    }

    static Display& get() {
        static auto* const instance = new Display;
        return *instance;
    }
};

void fillRow(uint8_t* row, size_t count, const Color& color) {
    const uint8_t pixel[kPixelBytes] = {color.red, color.green, color.blue, 0xff};
    for (size_t x = 0; x < count; ++x) std::memcpy(row + x * kPixelBytes, pixel, sizeof(pixel));
}

}  // namespace

std::optional<std::string> shareDisplay() {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    if (display.state != &display.own) return std::nullopt;
    void* memory =
            mmap(nullptr, sizeof(State), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED || !display.pixels.create()) return noMemory("the display", errno);
    display.state = new (memory) State(display.own);
    return std::nullopt;
}

std::optional<std::string> changeDisplay(const DisplayChange& change) {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    if (change.picture) {
        if (auto error = display.pixels.show(change.picture->pixels)) return error;
    }
    State& state = *display.state;
    if (change.size) state.size = *change.size;
    if (change.color) state.color = *change.color;
    if (change.size || change.color) state.showsPicture = false;
    if (change.picture) {
        state.size = {change.picture->width, change.picture->height};
        state.showsPicture = true;
    }
    if (change.rowPadding) state.rowPadding = *change.rowPadding;
    if (change.fault) state.fault = *change.fault;
    return std::nullopt;
}

DisplayFault displayFault() {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    return display.state->fault;
}

DisplaySize displaySize() {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    return display.state->size;
}

uint32_t displayRowPadding() {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    return display.state->rowPadding;
}

bool mapDisplay() {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    return display.map();
}

void copyDisplay(const android::Rect& area, uint8_t* pixels, size_t rowBytes) {
    Display& display = Display::get();
    const std::lock_guard lock(display.mutex);
    const State& state = *display.state;
    const int64_t left = std::max(area.left, 0);
    const int64_t top = std::max(area.top, 0);
    const int64_t right = std::min<int64_t>(area.right, state.size.width);
    const int64_t bottom = std::min<int64_t>(area.bottom, state.size.height);
    if (left >= right || !display.map()) return;
    const auto count = static_cast<size_t>(right - left);
    for (int64_t y = top; y < bottom; ++y) {
        uint8_t* const row = pixels + static_cast<size_t>(y - area.top) * rowBytes +
                             static_cast<size_t>(left - area.left) * kPixelBytes;
        if (state.showsPicture) {
            const size_t first =
                    static_cast<size_t>(y) * state.size.width + static_cast<size_t>(left);
            std::memcpy(row, display.pixels.data() + first * kPixelBytes, count * kPixelBytes);
        } else {
            fillRow(row, count, state.color);
        }
    }
}

}  // namespace platform
