/** The platform's capture calls, as the library and others may use them. */

#include <cerrno>
#include <csignal>
#include <functional>

#include <gtest/gtest.h>
#include <gui/SurfaceComposerClient.h>
#include <hardware/gralloc.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include "platform/Display.h"
#include "rgb/SyncScreenCaptureListener.h"

namespace android {
namespace {

using platform::changeDisplay;
using platform::DisplayChange;
using platform::DisplayFault;

using Bytes = std::vector<uint8_t>;
using Listener = sensor_priv::SyncScreenCaptureListener;

/** A request that the display serves: its area of `width` x `height` from the corner on. */
DisplayCaptureArgs request(int32_t width, int32_t height) {
    DisplayCaptureArgs args;
    args.displayToken = SurfaceComposerClient::getInternalDisplayToken();
    args.sourceCrop = Rect(0, 0, width, height);
    args.width = static_cast<uint32_t>(width);
    args.height = static_cast<uint32_t>(height);
    args.captureSecureLayers = true;
    return args;
}

gui::ScreenCaptureResults capture(const DisplayCaptureArgs& args) {
    const sp<Listener> listener = new Listener;
    EXPECT_EQ(ScreenshotClient::captureDisplay(args, listener), OK);
    return listener->waitForResults();
}

/** All bytes of the buffer, those behind its rows too. */
Bytes bytesOf(const sp<GraphicBuffer>& buffer) {
    void* base = nullptr;
    EXPECT_EQ(buffer->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base), OK);
    const auto* first = static_cast<const uint8_t*>(base);
    EXPECT_EQ(buffer->unlock(), OK);
    return {first, first + size_t{4} * buffer->getStride() * buffer->getHeight()};
}

void show(const DisplayChange& change) {
    EXPECT_EQ(changeDisplay(change), std::nullopt);
}

TEST(GraphicsTest, ServesOnlyWhatNeedsNoScalingAndNoConversion) {
    class OtherToken : public IBinder {};
    const struct {
        const char* what;
        std::function<void(DisplayCaptureArgs&)> change;
        status_t status;
    } kRequests[] = {
            {"as it is", [](auto&) {}, OK},
            {"no token", [](auto& args) { args.displayToken = nullptr; }, BAD_VALUE},
            {"other token", [](auto& args) { args.displayToken = new OtherToken; }, NAME_NOT_FOUND},
            {"wider", [](auto& args) { ++args.width; }, BAD_VALUE},
            {"lower", [](auto& args) { --args.height; }, BAD_VALUE},
            {"scaled across", [](auto& args) { args.frameScaleX = 2; }, BAD_VALUE},
            {"scaled down", [](auto& args) { args.frameScaleY = 0.5F; }, BAD_VALUE},
            {"other format", [](auto& args) { args.pixelFormat = ui::PixelFormat::RGB_565; },
             BAD_VALUE},
            {"no area", [](auto& args) { args = request(0, 1); }, BAD_VALUE},
            {"no height", [](auto& args) { args = request(1, 0); }, BAD_VALUE},
            {"turned", [](auto& args) { args = request(-1, 1); }, BAD_VALUE},
            {"widest", [](auto& args) { args = request(16384, 1); }, OK},
            {"too wide", [](auto& args) { args = request(16385, 1); }, BAD_VALUE},
            {"highest", [](auto& args) { args = request(1, 16384); }, OK},
            {"too high", [](auto& args) { args = request(1, 16385); }, BAD_VALUE},
    };
    for (const auto& [what, change, status] : kRequests) {
        DisplayCaptureArgs args = request(3, 2);
        change(args);
        const sp<Listener> listener = new Listener;
        EXPECT_EQ(ScreenshotClient::captureDisplay(args, listener), status) << what;
        EXPECT_EQ(ScreenshotClient::captureDisplay(args, nullptr), BAD_VALUE) << what;
        if (status != OK) continue;
        EXPECT_EQ(listener->waitForResults().result, OK) << what;
    }
    EXPECT_EQ(SurfaceComposerClient::getInternalDisplayToken(),
              SurfaceComposerClient::getInternalDisplayToken());
}

TEST(GraphicsTest, FaultsHaveTheStatusOfTheirPlace) {
    const DisplayCaptureArgs args = request(1, 1);
    DisplayChange change;
    change.fault = DisplayFault::kToken;
    show(change);
    EXPECT_EQ(SurfaceComposerClient::getInternalDisplayToken(), nullptr);
    change.fault = DisplayFault::kCapture;
    show(change);
    EXPECT_EQ(ScreenshotClient::captureDisplay(args, new Listener), UNKNOWN_ERROR);
    change.fault = DisplayFault::kResults;
    show(change);
    EXPECT_EQ(capture(args).result, UNKNOWN_ERROR);
    EXPECT_EQ(capture(args).buffer, nullptr);
    change.fault = DisplayFault::kLock;
    show(change);
    void* base = nullptr;
    const sp<GraphicBuffer> buffer = capture(args).buffer;
    EXPECT_EQ(buffer->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base), BAD_VALUE);
    EXPECT_EQ(buffer->unlock(), BAD_VALUE);
    EXPECT_EQ(base, nullptr);
    change.fault = DisplayFault::kListener;
    show(change);
    EXPECT_EQ(capture(args).result, PERMISSION_DENIED);
    EXPECT_EQ(capture(request(1, 0)).result, BAD_VALUE);
    change.fault = DisplayFault::kTwice;
    show(change);
    EXPECT_EQ(capture(args).result, NO_MEMORY) << "the first completion's";
    change.fault = DisplayFault::kFence;
    show(change);
    EXPECT_EQ(capture(args).result, -EINVAL);
    EXPECT_NE(capture(args).buffer, nullptr);
    change.fault = DisplayFault::kNoDisplay;
    show(change);
    EXPECT_EQ(SurfaceComposerClient::getInternalDisplayToken(), nullptr);
    EXPECT_TRUE(SurfaceComposerClient::getPhysicalDisplayIds().empty());
    EXPECT_EQ(ScreenshotClient::captureDisplay(args, new Listener), NAME_NOT_FOUND);
}

TEST(GraphicsTest, TheOneDisplayIsFoundByItsIdAndNeverTurns) {
    DisplayChange change;
    change.size = {10, 20};
    show(change);
    const auto ids = SurfaceComposerClient::getPhysicalDisplayIds();
    ASSERT_EQ(ids.size(), 1u);
    const sp<IBinder> token = SurfaceComposerClient::getPhysicalDisplayToken(ids[0]);
    EXPECT_EQ(token, SurfaceComposerClient::getInternalDisplayToken());
    EXPECT_EQ(SurfaceComposerClient::getPhysicalDisplayToken({ids[0].value + 1}), nullptr);
    ui::DisplayState state;
    EXPECT_EQ(SurfaceComposerClient::getDisplayState(token, &state), OK);
    EXPECT_EQ(state.orientation, ui::Rotation::Rotation0);
    EXPECT_EQ(state.layerStackSpaceRect.width, 10);
    EXPECT_EQ(state.layerStackSpaceRect.height, 20);
    EXPECT_EQ(SurfaceComposerClient::getDisplayState(nullptr, &state), NAME_NOT_FOUND);
}

TEST(GraphicsTest, ABufferHasTheDisplaysPixelsAndWhiteBehindItsRows) {
    DisplayChange change;
    change.picture =
            platform::Picture{2, 2, {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16}};
    change.rowPadding = 1;
    show(change);
    const gui::ScreenCaptureResults results = capture(request(2, 3));
    EXPECT_TRUE(results.capturedSecureLayers);
    EXPECT_EQ(results.fence->wait(0), OK);
    EXPECT_EQ(results.buffer->getWidth(), 2u);
    EXPECT_EQ(results.buffer->getHeight(), 3u);
    EXPECT_EQ(results.buffer->getStride(), 3u);
    EXPECT_EQ(results.buffer->getPixelFormat(), PIXEL_FORMAT_RGBA_8888);
    EXPECT_EQ(bytesOf(results.buffer), (Bytes{1, 2,  3,  4,  5,  6,  7,  8,  255, 255, 255, 255,
                                              9, 10, 11, 12, 13, 14, 15, 16, 255, 255, 255, 255,
                                              0, 0,  0,  0,  0,  0,  0,  0,  255, 255, 255, 255}));

    change = {};
    change.color = {7, 8, 9};
    change.rowPadding = 0;
    show(change);
    EXPECT_EQ(bytesOf(capture(request(1, 2)).buffer), (Bytes{7, 8, 9, 255, 7, 8, 9, 255}));
    DisplayCaptureArgs corner = request(2, 2);
    corner.sourceCrop = Rect(-1, -1, 1, 1);
    EXPECT_EQ(bytesOf(capture(corner).buffer),
              (Bytes{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 7, 8, 9, 255}));
    DisplayCaptureArgs insecure = request(1, 1);
    insecure.captureSecureLayers = false;
    EXPECT_FALSE(capture(insecure).capturedSecureLayers);
    EXPECT_EQ(bytesOf(capture(insecure).buffer), (Bytes{0, 0, 0, 0})) << "all of it is secure";
}

TEST(GraphicsTest, ABufferIsLockedForReadingOnlyAndUnlockedAsOften) {
    DisplayChange change;
    change.rowPadding = 5;
    show(change);
    const sp<GraphicBuffer> buffer = capture(request(3, 1)).buffer;
    void* base = nullptr;
    int32_t bytesPerPixel = 0;
    int32_t bytesPerStride = 0;
    EXPECT_EQ(buffer->unlock(), BAD_VALUE);
    EXPECT_EQ(buffer->lock(0x30, &base), BAD_VALUE) << "to write";
    EXPECT_EQ(buffer->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base, &bytesPerPixel, &bytesPerStride),
              OK);
    EXPECT_EQ(buffer->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base), OK);
    EXPECT_EQ(bytesPerPixel, 4);
    EXPECT_EQ(bytesPerStride, 32);
    EXPECT_EQ(buffer->unlock(), OK);
    EXPECT_EQ(buffer->unlock(), OK);
    EXPECT_EQ(buffer->unlock(), BAD_VALUE);
    sp<GraphicBuffer> locked = capture(request(1, 1)).buffer;
    EXPECT_DEATH((locked->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base), locked = nullptr),
                 "destroyed while it was locked");
}

TEST(GraphicsTest, TheFenceSignalsAfterTheListenerWasTold) {
    class Observer : public gui::BnScreenCaptureListener {
    public:
        binder::Status onScreenCaptureCompleted(const gui::ScreenCaptureResults& results) override {
            early = results.fence->wait(0);
            return listener->onScreenCaptureCompleted(results);
        }

        status_t early = OK;
        const sp<Listener> listener = new Listener;
    };
    const sp<Observer> observer = new Observer;
    EXPECT_EQ(ScreenshotClient::captureDisplay(request(1, 1), observer), OK);
    EXPECT_EQ(observer->listener->waitForResults().fence->wait(0), OK);
    EXPECT_EQ(observer->early, -ETIME);
}

TEST(GraphicsTest, APictureForWhichThereIsNoMemoryChangesNothing) {
    std::signal(SIGXFSZ, SIG_IGN);
    rlimit limit{};
    getrlimit(RLIMIT_FSIZE, &limit);
    DisplayChange change;
    change.picture = platform::Picture{1, 1, {1, 2, 3, 4}};
    show(change);
    const rlimit small{4096, limit.rlim_max};
    setrlimit(RLIMIT_FSIZE, &small);  // which the memory of a picture is subject to
    change.picture = platform::Picture{2000, 1, Bytes(8000)};
    change.rowPadding = 1;
    const auto error = changeDisplay(change);
    setrlimit(RLIMIT_FSIZE, &limit);
    EXPECT_EQ(error, "no memory for a picture: File too large");
    EXPECT_EQ(bytesOf(capture(request(1, 1)).buffer), (Bytes{1, 2, 3, 4}));
}

/** What a process forked from this one sees of the first `count` pixels of the display. */
Bytes seenByAnother(size_t count) {
    int ends[2];
    EXPECT_EQ(pipe(ends), 0);
    if (fork() == 0) {
        Bytes bytes(4 * count);
        platform::copyDisplay(Rect(0, 0, static_cast<int32_t>(count), 1), bytes.data(), 4 * count);
        _exit(write(ends[1], bytes.data(), bytes.size()) < 0 ? 1 : 0);
    }
    close(ends[1]);
    Bytes bytes(4 * count);
    EXPECT_EQ(read(ends[0], bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
    close(ends[0]);
    wait(nullptr);
    return bytes;
}

TEST(GraphicsTest, ForkedProcessesSeeOneDisplayWhicheverChangesIt) {
    DisplayChange change;
    change.color = {1, 2, 3};
    show(change);
    EXPECT_EQ(platform::shareDisplay(), std::nullopt);
    EXPECT_EQ(seenByAnother(1), (Bytes{1, 2, 3, 255}));
    // Each larger than the one before, which another process has mapped by then.
    for (const uint32_t width : {2U, 3000U, 100U, 5000U}) {
        const Bytes pixels(size_t{4} * width, static_cast<uint8_t>(width));
        if (fork() == 0) {
            change = {};
            change.picture = platform::Picture{width, 1, pixels};
            _exit(changeDisplay(change) ? 1 : 0);
        }
        int status = 0;
        wait(&status);
        EXPECT_EQ(status, 0);
        EXPECT_EQ(platform::shareDisplay(), std::nullopt) << "once more does no harm";
        EXPECT_EQ(seenByAnother(width), pixels);
        EXPECT_EQ(bytesOf(capture(request(static_cast<int32_t>(width), 1)).buffer), pixels);
    }
}

}  // namespace
}  // namespace android
