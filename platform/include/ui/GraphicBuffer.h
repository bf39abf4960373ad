#pragma once

#include <atomic>
#include <cstddef>
#include <memory>

#include <stdint.h>
#include <ui/PixelFormat.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>

namespace platform {
class CaptureThread;
}

namespace android {

/** Pixels in memory. Ends the process if it is destroyed while it is locked. */
class GraphicBuffer : public RefBase {
public:
    uint32_t getWidth() const { return mWidth; }
    uint32_t getHeight() const { return mHeight; }

    /** Pixels from the begin of one row to the begin of the next. */
    uint32_t getStride() const { return mStride; }

    PixelFormat getPixelFormat() const { return mFormat; }

    /**
     * Gives the processor access. `inUsage` must be GRALLOC_USAGE_SW_READ_OFTEN, or it returns
     * BAD_VALUE. Sets `*vaddr` to the first pixel, valid as long as the buffer. The other two
     * results are optional. Locks nest.
     */
    status_t lock(uint32_t inUsage, void** vaddr, int32_t* outBytesPerPixel = nullptr,
                  int32_t* outBytesPerStride = nullptr);

    /** Ends the access that one `lock` gave. BAD_VALUE if there is none. */
    status_t unlock();

private:
    friend class platform::CaptureThread;

    /** All pixels are zero. `mPixels` is null if there is no memory. */
    GraphicBuffer(uint32_t width, uint32_t height, uint32_t stride, bool lockable);
    ~GraphicBuffer() override;

    size_t rowBytes() const;

    // Constant after construction.
    const uint32_t mWidth;
    const uint32_t mHeight;
    const uint32_t mStride;
    const PixelFormat mFormat = PIXEL_FORMAT_RGBA_8888;
    const bool mLockable;
    const std::unique_ptr<uint8_t, void (*)(void*)> mPixels;

    std::atomic<int> mLocks{0};
};

}  // namespace android
