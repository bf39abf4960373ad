/** The platform's graphics calls, on the display of platform/Display.h. */

#include <cerrno>
#include <condition_variable>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <memory>
#include <mutex>
#include <thread>
#include <utility>

#include <gui/ScreenCaptureResults.h>
#include <gui/SurfaceComposerClient.h>
#include <hardware/gralloc.h>
#include <log/log.h>
#include <ui/Fence.h>
#include <ui/GraphicBuffer.h>

#include "platform/Display.h"

namespace platform {

using android::BAD_VALUE;
using android::DisplayCaptureArgs;
using android::Fence;
using android::GraphicBuffer;
using android::NAME_NOT_FOUND;
using android::NO_MEMORY;
using android::OK;
using android::PERMISSION_DENIED;
using android::PhysicalDisplayId;
using android::Rect;
using android::sp;
using android::status_t;
using android::UNKNOWN_ERROR;

namespace {

constexpr PhysicalDisplayId kDisplayId = {1};

class DisplayToken : public android::IBinder {};

/** Never destroyed: captures compare with it until the process ends. */
const sp<android::IBinder>& displayToken() {
    static auto* const instance = new sp<android::IBinder>(new DisplayToken);
    return *instance;
}

bool isDisplay(const sp<android::IBinder>& token) {
    return token == displayToken() && displayFault() != DisplayFault::kNoDisplay;
}

/** Whether the display serves the request. It neither scales nor converts. */
status_t judge(const DisplayCaptureArgs& args) {
    if (args.displayToken == nullptr) return BAD_VALUE;
    if (!isDisplay(args.displayToken)) return NAME_NOT_FOUND;
    const int64_t width = int64_t{args.sourceCrop.right} - args.sourceCrop.left;
    const int64_t height = int64_t{args.sourceCrop.bottom} - args.sourceCrop.top;
    const bool isServed = width > 0 && width <= Picture::kMaxSide && height > 0 &&
                          height <= Picture::kMaxSide && args.width == width &&
                          args.height == height && args.frameScaleX == 1 && args.frameScaleY == 1 &&
                          args.pixelFormat == android::ui::PixelFormat::RGBA_8888;
    if (!isServed) return BAD_VALUE;
    switch (displayFault()) {
        case DisplayFault::kCapture:
            return UNKNOWN_ERROR;
        case DisplayFault::kListener:
            return PERMISSION_DENIED;
        default:
            return OK;
    }
}

}  // namespace

/**
 * Completes captures one after another, on a thread of its own. No step waits for a clock. The
 * listener is told first; the buffer is filled afterwards, and then its fence signals.
 */
class CaptureThread {
public:
    struct Request {
        Rect area;
        bool secure;
        uint32_t rowPadding;
        DisplayFault fault;
        status_t refusal;  // OK: none
        sp<android::IScreenCaptureListener> listener;
    };

    /** Never destroyed: its thread uses it until the process ends. */
    static CaptureThread& get() {
        static auto* const instance = new CaptureThread;
        return *instance;
    }

    void post(Request request) {
        const std::lock_guard lock(mMutex);
        mRequests.push_back(std::move(request));
        mPosted.notify_one();
    }

private:
    CaptureThread() {
        std::thread([this] {
            for (;;) complete(take());
        }).detach();
    }

    Request take() {
        std::unique_lock lock(mMutex);
        mPosted.wait(lock, [this] { return !mRequests.empty(); });
        Request request = std::move(mRequests.front());
        mRequests.pop_front();
        return request;
    }

    static void complete(Request request) {
        const auto signal = std::make_shared<Fence::Signal>();
        if (request.fault == DisplayFault::kFence) signal->status = -EINVAL;
        sp<GraphicBuffer> buffer;
        {
            android::gui::ScreenCaptureResults results;
            results.fence = new Fence(signal);
            results.capturedSecureLayers = request.secure;
            if (request.fault == DisplayFault::kTwice) {
                results.result = NO_MEMORY;
                request.listener->onScreenCaptureCompleted(results);
                results.result = OK;
            }
            if (request.refusal != OK) {
                results.result = request.refusal;
            } else if (request.fault == DisplayFault::kResults) {
                results.result = UNKNOWN_ERROR;
            } else if (buffer = makeBuffer(request); buffer == nullptr) {
                results.result = NO_MEMORY;
            }
            results.buffer = buffer;
            request.listener->onScreenCaptureCompleted(results);
        }
        if (buffer != nullptr) fill(buffer.get(), request);
        // Releases the capture before the waiting thread goes on.
        buffer = nullptr;
        request.listener = nullptr;
        const std::lock_guard lock(signal->mutex);
        signal->isGiven = true;
        signal->given.notify_all();
    }

    /** Null if there is no memory for it, or for reading the display. */
    static sp<GraphicBuffer> makeBuffer(const Request& request) {
        if (!mapDisplay()) return nullptr;
        const auto width = static_cast<uint32_t>(request.area.getWidth());
        const auto height = static_cast<uint32_t>(request.area.getHeight());
        const sp<GraphicBuffer> buffer = new GraphicBuffer(
                width, height, width + request.rowPadding, request.fault != DisplayFault::kLock);
        return buffer->mPixels == nullptr ? nullptr : buffer;
    }

    static void fill(GraphicBuffer* buffer, const Request& request) {
        uint8_t* const pixels = buffer->mPixels.get();
        if (request.secure) copyDisplay(request.area, pixels, buffer->rowBytes());
        if (request.rowPadding == 0) return;
        for (size_t row = 0; row < buffer->getHeight(); ++row) {
            // White, so that a reader of the padding gets a wrong average.
            std::memset(pixels + row * buffer->rowBytes() + size_t{4} * buffer->getWidth(), 0xff,
                        size_t{4} * request.rowPadding);
        }
    }

    std::mutex mMutex;
    std::condition_variable mPosted;
    std::deque<Request> mRequests;  // guarded by mMutex
};

}  // namespace platform

namespace android {

using platform::CaptureThread;
using platform::DisplayFault;

uint32_t bytesPerPixel(PixelFormat format) {
    switch (format) {
        case PIXEL_FORMAT_RGBA_FP16:
            return 8;
        case PIXEL_FORMAT_RGBA_8888:
        case PIXEL_FORMAT_RGBX_8888:
        case PIXEL_FORMAT_BGRA_8888:
        case PIXEL_FORMAT_RGBA_1010102:
            return 4;
        case PIXEL_FORMAT_RGB_888:
            return 3;
        case PIXEL_FORMAT_RGB_565:
            return 2;
    }
    return 0;
}

namespace gui {

ScreenCaptureResults::ScreenCaptureResults() = default;
ScreenCaptureResults::~ScreenCaptureResults() = default;

status_t ScreenCaptureResults::writeToParcel(Parcel*) const {
    return INVALID_OPERATION;
}

status_t ScreenCaptureResults::readFromParcel(const Parcel*) {
    return INVALID_OPERATION;
}

}  // namespace gui

const sp<Fence> Fence::NO_FENCE(new Fence);

status_t Fence::wait(int timeoutMs) {
    if (!isValid()) return OK;
    std::unique_lock lock(mSignal->mutex);
    if (timeoutMs == 0 && !mSignal->isGiven) return -ETIME;
    mSignal->given.wait(lock, [this] { return mSignal->isGiven; });
    return mSignal->status;
}

status_t Fence::waitForever(const char*) {
    return wait(-1);
}

GraphicBuffer::GraphicBuffer(uint32_t width, uint32_t height, uint32_t stride, bool lockable)
      : mWidth(width),
        mHeight(height),
        mStride(stride),
        mLockable(lockable),
        mPixels(static_cast<uint8_t*>(std::calloc(height, rowBytes())), std::free) {}

GraphicBuffer::~GraphicBuffer() {
    LOG_ALWAYS_FATAL_IF(mLocks != 0, "a graphic buffer was destroyed while it was locked");
}

size_t GraphicBuffer::rowBytes() const {
    return size_t{mStride} * bytesPerPixel(mFormat);
}

status_t GraphicBuffer::lock(uint32_t inUsage, void** vaddr, int32_t* outBytesPerPixel,
                             int32_t* outBytesPerStride) {
    if (!mLockable || inUsage != GRALLOC_USAGE_SW_READ_OFTEN) return BAD_VALUE;
    ++mLocks;
    *vaddr = mPixels.get();
    if (outBytesPerPixel != nullptr) {
        *outBytesPerPixel = static_cast<int32_t>(bytesPerPixel(mFormat));
    }
    if (outBytesPerStride != nullptr) *outBytesPerStride = static_cast<int32_t>(rowBytes());
    return OK;
}

status_t GraphicBuffer::unlock() {
    if (mLocks == 0) return BAD_VALUE;
    --mLocks;
    return OK;
}

sp<IBinder> SurfaceComposerClient::getInternalDisplayToken() {
    const DisplayFault fault = platform::displayFault();
    if (fault == DisplayFault::kToken || fault == DisplayFault::kNoDisplay) return nullptr;
    return platform::displayToken();
}

std::vector<PhysicalDisplayId> SurfaceComposerClient::getPhysicalDisplayIds() {
    if (platform::displayFault() == DisplayFault::kNoDisplay) return {};
    return {platform::kDisplayId};
}

sp<IBinder> SurfaceComposerClient::getPhysicalDisplayToken(PhysicalDisplayId displayId) {
    return displayId.value == platform::kDisplayId.value ? getInternalDisplayToken() : nullptr;
}

status_t SurfaceComposerClient::getDisplayState(const sp<IBinder>& display,
                                                ui::DisplayState* state) {
    if (!platform::isDisplay(display)) return NAME_NOT_FOUND;
    const platform::DisplaySize size = platform::displaySize();
    *state = {ui::Rotation::Rotation0,
              {static_cast<int32_t>(size.width), static_cast<int32_t>(size.height)}};
    return OK;
}

status_t ScreenshotClient::captureDisplay(const DisplayCaptureArgs& captureArgs,
                                          const sp<IScreenCaptureListener>& captureListener) {
    if (captureListener == nullptr) return BAD_VALUE;
    const DisplayFault fault = platform::displayFault();
    const status_t refusal = platform::judge(captureArgs);
    if (refusal != OK && fault != DisplayFault::kListener) return refusal;
    CaptureThread::get().post({captureArgs.sourceCrop, captureArgs.captureSecureLayers,
                               platform::displayRowPadding(), fault, refusal, captureListener});
    return OK;
}

}  // namespace android
