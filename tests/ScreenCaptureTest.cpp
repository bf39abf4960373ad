#include <array>
#include <csignal>
#include <random>
#include <string>
#include <utility>

#include <binder/Status.h>
#include <dlfcn.h>
#include <gui/SurfaceComposerClient.h>
#include <ui/GraphicBuffer.h>

#include "core/Log.h"
#include "platform/Display.h"
#include "rgb/RgbShotManager.h"
#include "rgb/SyncScreenCaptureListener.h"
#include "tests/DeviceTest.h"
#include "tests/Pictures.h"

namespace {

/** The last request for a capture, and what was done to its buffer: "lock 3 unlock ". */
android::DisplayCaptureArgs request;
std::string buffered;

template <typename Function>
Function* platforms(const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

namespace android {

// These stand before the platform's own.

status_t ScreenshotClient::captureDisplay(const DisplayCaptureArgs& args,
                                          const sp<IScreenCaptureListener>& listener) {
    static auto* const next = platforms<decltype(captureDisplay)>(
            "_ZN7android16ScreenshotClient14captureDisplayERKNS_3gui18DisplayCaptureArgsE"
            "RKNS_2spINS1_22IScreenCaptureListenerEEE");
    request = args;
    return next(args, listener);
}

status_t GraphicBuffer::lock(uint32_t usage, void** base, int32_t* pixel, int32_t* row) {
    static auto* const next =
            platforms<status_t(GraphicBuffer*, uint32_t, void**, int32_t*, int32_t*)>(
                    "_ZN7android13GraphicBuffer4lockEjPPvPiS3_");
    buffered += "lock " + std::to_string(usage) + ' ';
    return next(this, usage, base, pixel, row);
}

status_t GraphicBuffer::unlock() {
    static auto* const next =
            platforms<status_t(GraphicBuffer*)>("_ZN7android13GraphicBuffer6unlockEv");
    buffered += "unlock ";
    return next(this);
}

namespace {

using platform::changeDisplay;
using platform::DisplayChange;
using platform::DisplayFault;
using platform::Picture;

using Rgb = std::array<int, 3>;
using Rectangle = std::array<int, 4>;

constexpr char kSampleCount[] = "persist.zuno.rgb.shot.count";
constexpr Rgb kUntouched = {-1, -2, -3};

/** `kUntouched` if the sample fails. */
Rgb sample(Rectangle rect) {
    Rgb rgb = kUntouched;
    const int status = RgbShotManager::getInstance()->getScreenPixcel(rgb.data(), rect.data());
    EXPECT_EQ(status, rgb != kUntouched);
    return rgb;
}

class ScreenCaptureTest : public DeviceTest {
protected:
    /** Leaves the lines of the start behind. */
    ScreenCaptureTest() {
        RgbShotManager::getInstance();
        taken();
    }
};

TEST_F(ScreenCaptureTest, AveragesAnyRectangleOfAPicture) {
    DisplayChange change;
    change.picture = randomPicture(70, 150, 1);
    std::mt19937 random(2);
    for (int round = 0; round < 300; ++round) {
        change.rowPadding = round % 3 == 0 ? random() % 70 : 0;
        changeDisplay(change);
        const int left = static_cast<int>(random() % 100) - 20;
        const int top = static_cast<int>(random() % 180) - 20;
        const Rectangle rect = {left, top, left + 1 + static_cast<int>(random() % 120),
                                top + 1 + static_cast<int>(random() % 170)};
        ASSERT_EQ(sample(rect), averageOf(*change.picture, rect)) << ::testing::PrintToString(rect);
    }
}

TEST_F(ScreenCaptureTest, AsksForTheRectangleWithAllItsLayersUnscaled) {
    EXPECT_EQ(sample({20, 10, 53, 54}), Rgb{});
    EXPECT_EQ(request.displayToken, SurfaceComposerClient::getInternalDisplayToken());
    EXPECT_EQ(request.sourceCrop.left, 20);
    EXPECT_EQ(request.sourceCrop.top, 10);
    EXPECT_EQ(request.sourceCrop.right, 53);
    EXPECT_EQ(request.sourceCrop.bottom, 54);
    EXPECT_EQ(request.width, 33u);
    EXPECT_EQ(request.height, 44u);
    EXPECT_TRUE(request.captureSecureLayers && request.useIdentityTransform);
    EXPECT_FALSE(request.allowProtected || request.grayscale);
    EXPECT_EQ(request.pixelFormat, ui::PixelFormat::RGBA_8888);
    EXPECT_EQ(request.frameScaleX * request.frameScaleY, 1);
    EXPECT_EQ(request.uid, -1);
    EXPECT_EQ(buffered, "lock 3 unlock ");
}

TEST_F(ScreenCaptureTest, OnlyARectangleOfFourZerosIsNoScope) {
    DisplayChange change;
    change.color = {200, 100, 52};
    changeDisplay(change);
    EXPECT_EQ(sample({0, 0, 0, 0}), kUntouched);
    EXPECT_EQ(sample({-1, 0, 1, 1}), (Rgb{100, 50, 26}));
    EXPECT_EQ(sample({0, -1, 1, 1}), (Rgb{100, 50, 26}));
    EXPECT_EQ(sample({-1, -1, 0, 0}), Rgb{});
    EXPECT_EQ(taken(), (Lines{"0 log 3 ic scope is 0. not support pixcel"}));
    for (Rectangle rect : {Rectangle{0, 0, 1, 0}, Rectangle{0, 0, 0, 1}}) {
        EXPECT_EQ(sample(rect), kUntouched);
        EXPECT_EQ(taken(), (Lines{"0 log 6 UL: captureDisplay failed!"}));
    }
}

TEST_F(ScreenCaptureTest, CountsAndLogsASample) {
    DisplayChange change;
    change.color = {200, 100, 50};
    changeDisplay(change);
    advanceTo(5000);
    EXPECT_EQ(sample({0, 0, 10, 10}), (Rgb{200, 100, 50}));
    EXPECT_EQ(taken(), Lines{});
    mLogSwitch = 1;
    EXPECT_EQ(sample({1079, 2399, 1081, 2401}), (Rgb{50, 25, 12})) << "one pixel is inside";
    advanceTo(8000);
    EXPECT_EQ(taken(), (Lines{"5000 log 3 UL: Pixcel changed: red = 50, green = 25, blue = 12",
                              "5500 persist.zuno.rgb.shot.count=2"}));
}

TEST_F(ScreenCaptureTest, AFailureIsLoggedLeavesTheOutputAndCountsNothing) {
    constexpr char kNoScope[] = "0 log 3 ic scope is 0. not support pixcel";
    constexpr char kNoToken[] = "0 log 6 Unable to get handle for display";
    constexpr char kNoCapture[] = "0 log 6 UL: captureDisplay failed!";
    constexpr char kNoResults[] = "0 log 6 UL: captureResults failed!";
    constexpr char kNoBase[] = "0 log 6 UL: rgb update fail, base is NULL ";
    constexpr int kMin = std::numeric_limits<int>::min();
    constexpr int kMax = std::numeric_limits<int>::max();
    const struct {
        DisplayFault fault;
        Rectangle rect;
        const char* log;
    } kCases[] = {
            {DisplayFault::kToken, {0, 0, 0, 0}, kNoScope},
            {DisplayFault::kToken, {0, 0, 10, 10}, kNoToken},
            {DisplayFault::kCapture, {0, 0, 10, 10}, kNoCapture},
            {DisplayFault::kResults, {0, 0, 10, 10}, kNoResults},
            {DisplayFault::kLock, {0, 0, 10, 10}, kNoBase},
            {DisplayFault::kListener, {0, 0, 10, 10}, kNoResults},
            {DisplayFault::kListener, {0, 0, 10, 16385}, kNoResults},
            {DisplayFault::kTwice, {0, 0, 10, 10}, kNoResults},
            {DisplayFault::kNoDisplay, {0, 0, 10, 10}, kNoToken},
            {DisplayFault::kFence, {0, 0, 10, 10}, kNoResults},
            {DisplayFault::kNone, {0, 0, 0, 10}, kNoCapture},
            {DisplayFault::kNone, {5, 0, 4, 10}, kNoCapture},
            {DisplayFault::kNone, {0, 0, 10, 16385}, kNoCapture},
            {DisplayFault::kNone, {kMin, kMin, kMax, kMax}, kNoCapture},
            {DisplayFault::kNone, {kMax, 0, kMin, 1}, kNoCapture},
    };
    for (const auto& [fault, rect, log] : kCases) {
        DisplayChange change;
        change.fault = fault;
        changeDisplay(change);
        EXPECT_EQ(sample(rect), kUntouched);
        EXPECT_EQ(taken(), Lines{log});
        EXPECT_EQ(std::exchange(buffered, ""),
                  fault == DisplayFault::kLock ? "lock 3 unlock " : "");
    }
    advanceTo(1000);
    EXPECT_EQ(property(kSampleCount), "");

    DisplayChange change;
    change.fault = DisplayFault::kNone;
    changeDisplay(change);
    EXPECT_EQ(sample({0, 0, 10, 10}), Rgb{});
    advanceTo(1500);
    EXPECT_EQ(property(kSampleCount), "1");
}

TEST_F(ScreenCaptureTest, AListenerServesOneCapture) {
    const sp<SyncScreenCaptureListener> listener = new SyncScreenCaptureListener;
    gui::ScreenCaptureResults results;
    results.result = NO_MEMORY;
    EXPECT_TRUE(listener->onScreenCaptureCompleted(results).isOk());
    EXPECT_TRUE(listener->onScreenCaptureCompleted({}).isOk());
    EXPECT_EQ(listener->waitForResults().result, NO_MEMORY);
    EXPECT_TRUE(listener->onScreenCaptureCompleted({}).isOk());
    EXPECT_EXIT([&]() noexcept { listener->waitForResults(); }(),
                ::testing::KilledBySignal(SIGABRT), "Future already retrieved");
}

TEST_F(ScreenCaptureTest, APictureGivesTheDisplayItsSizeUntilAColorOrASizeEndsIt) {
    DisplayChange change;
    change.color = {10, 20, 30};
    change.picture = Picture{1, 2, {1, 2, 3, 0, 5, 6, 7, 255}};
    changeDisplay(change);
    EXPECT_EQ(sample({0, 0, 1, 2}), (Rgb{3, 4, 5}));
    change = {};
    change.rowPadding = 3;
    changeDisplay(change);
    EXPECT_EQ(sample({0, 1, 2, 2}), (Rgb{2, 3, 3})) << "half of it is outside";
    change = {};
    change.size = {1, 1};
    changeDisplay(change);
    EXPECT_EQ(sample({0, 0, 1, 2}), (Rgb{5, 10, 15}));
}

}  // namespace
}  // namespace android
