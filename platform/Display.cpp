#include "platform/Display.h"

#include <algorithm>
#include <cstring>
#include <mutex>
#include <new>

#include <log/log.h>
#include <sys/mman.h>

namespace platform {

namespace {

constexpr size_t kPixelBytes = 4;
constexpr size_t kMaxPictureBytes = kPixelBytes * Picture::kMaxSide * Picture::kMaxSide;

/** What forked processes share, the picture's pixels behind it. */
struct SharedDisplay {
    DisplaySize size = {1080, 2400};
    Color color = {};
    bool showsPicture = false;
    uint32_t rowPadding = 0;
    DisplayFault fault = DisplayFault::kNone;

    uint8_t* picture() { return reinterpret_cast<uint8_t*>(this + 1); }

    /** Pages of shared memory that are never touched cost nothing. */
    static SharedDisplay& get() {
        static auto* const instance = [] {
            void* memory =
                    mmap(nullptr, sizeof(SharedDisplay) + kMaxPictureBytes, PROT_READ | PROT_WRITE,
                         MAP_SHARED | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
            LOG_ALWAYS_FATAL_IF(memory == MAP_FAILED, "cannot map the display");
            return new (memory) SharedDisplay;
        }();
        return *instance;
    }
};

/** Orders this process's threads. */
std::mutex gMutex;

}  // namespace

void shareDisplay() {
    SharedDisplay::get();
}

void changeDisplay(const DisplayChange& change) {
    const std::lock_guard lock(gMutex);
    SharedDisplay& display = SharedDisplay::get();
    if (change.size) display.size = *change.size;
    if (change.color) display.color = *change.color;
    if (change.size || change.color) display.showsPicture = false;
    if (change.picture) {
        display.size = {change.picture->width, change.picture->height};
        display.showsPicture = true;
        std::memcpy(display.picture(), change.picture->pixels.data(),
                    change.picture->pixels.size());
    }
    if (change.rowPadding) display.rowPadding = *change.rowPadding;
    if (change.fault) display.fault = *change.fault;
}

DisplayFault displayFault() {
    const std::lock_guard lock(gMutex);
    return SharedDisplay::get().fault;
}

uint32_t displayRowPadding() {
    const std::lock_guard lock(gMutex);
    return SharedDisplay::get().rowPadding;
}

void copyDisplay(const android::Rect& area, uint8_t* pixels, size_t rowBytes) {
    const std::lock_guard lock(gMutex);
    SharedDisplay& display = SharedDisplay::get();
    const int64_t left = std::max(area.left, 0);
    const int64_t top = std::max(area.top, 0);
    const int64_t right = std::min<int64_t>(area.right, display.size.width);
    const int64_t bottom = std::min<int64_t>(area.bottom, display.size.height);
    if (left >= right) return;
    for (int64_t y = top; y < bottom; ++y) {
        uint8_t* const row = pixels + static_cast<size_t>(y - area.top) * rowBytes +
                             static_cast<size_t>(left - area.left) * kPixelBytes;
        const size_t count = static_cast<size_t>(right - left);
        if (display.showsPicture) {
            const size_t first =
                    static_cast<size_t>(y) * display.size.width + static_cast<size_t>(left);
            std::memcpy(row, display.picture() + first * kPixelBytes, count * kPixelBytes);
        } else {
            const uint8_t pixel[kPixelBytes] = {display.color.red, display.color.green,
                                                display.color.blue, 0xff};
            for (size_t x = 0; x < count; ++x) {
                std::memcpy(row + x * kPixelBytes, pixel, sizeof(pixel));
            }
        }
    }
}

}  // namespace platform
