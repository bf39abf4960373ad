#include <cstddef>
#include <type_traits>

#include <binder/IBinder.h>
#include <binder/Parcelable.h>
#include <gtest/gtest.h>
#include <gui/ScreenCaptureResults.h>
#include <gui/SurfaceComposerClient.h>
#include <gui/SyncScreenCaptureListener.h>
#include <hardware/sensors.h>

using PlatformsListener = android::SyncScreenCaptureListener;

#include "rgb/SyncScreenCaptureListener.h"

namespace android {
namespace {

// What the device's headers refuse.
static_assert(!std::is_destructible_v<IBinder>);
static_assert(!std::is_destructible_v<GraphicBuffer>);
static_assert(!std::is_destructible_v<Fence> && !std::is_copy_constructible_v<Fence>);
static_assert(std::is_final_v<binder::Status>);
static_assert(std::is_abstract_v<gui::BnScreenCaptureListener>);
static_assert(!std::is_convertible_v<ui::PixelFormat, PixelFormat>);

// What they derive from.
static_assert(std::is_base_of_v<Parcelable, gui::ScreenCaptureResults>);
static_assert(std::has_virtual_destructor_v<gui::ScreenCaptureResults>);
static_assert(std::has_virtual_destructor_v<CaptureArgs>);
static_assert(std::is_base_of_v<RefBase, SurfaceComposerClient>);
static_assert(std::is_base_of_v<LightRefBase<Fence>, Fence>);
static_assert(std::is_same_v<IScreenCaptureListener, gui::IScreenCaptureListener>);
static_assert(std::is_same_v<DisplayCaptureArgs, gui::DisplayCaptureArgs>);

// The same layout on 32 and 64 bits.
static_assert(sizeof(sensors_event_t) == 104);
static_assert(offsetof(sensors_event_t, timestamp) == 16);
static_assert(offsetof(sensors_event_t, data) == 24 && offsetof(sensors_event_t, u64.data) == 24);
static_assert(offsetof(sensors_event_t, flags) == 88);

TEST(PlatformHeadersTest, DefaultsAreTheDevices) {
    const DisplayCaptureArgs args;
    EXPECT_EQ(args.pixelFormat, ui::PixelFormat::RGBA_8888);
    EXPECT_EQ(args.sourceCrop.left, 0);
    EXPECT_EQ(args.sourceCrop.top, 0);
    EXPECT_EQ(args.sourceCrop.right, -1);
    EXPECT_EQ(args.sourceCrop.bottom, -1);
    EXPECT_FALSE(args.sourceCrop.isValid());
    EXPECT_TRUE(args.sourceCrop.isEmpty());
    EXPECT_EQ(args.frameScaleX, 1);
    EXPECT_EQ(args.frameScaleY, 1);
    EXPECT_EQ(args.uid, -1);
    EXPECT_EQ(args.dataspace, ui::Dataspace::UNKNOWN);
    EXPECT_EQ(args.displayToken, nullptr);
    EXPECT_EQ(args.width + args.height, 0u);
    EXPECT_FALSE(args.captureSecureLayers || args.allowProtected || args.grayscale ||
                 args.useIdentityTransform);

    gui::ScreenCaptureResults results;
    EXPECT_EQ(results.fence, Fence::NO_FENCE);
    EXPECT_FALSE(results.fence->isValid());
    EXPECT_EQ(results.fence->waitForever(""), OK);
    EXPECT_EQ(results.buffer, nullptr);
    EXPECT_EQ(results.capturedDataspace, ui::Dataspace::V0_SRGB);
    EXPECT_EQ(static_cast<int32_t>(results.capturedDataspace), 142671872);
    EXPECT_FALSE(results.capturedSecureLayers || results.capturedHdrLayers);
    EXPECT_EQ(results.result, OK);
    EXPECT_EQ(results.writeToParcel(nullptr), INVALID_OPERATION);
    EXPECT_EQ(results.readFromParcel(nullptr), INVALID_OPERATION);
}

TEST(PlatformHeadersTest, APixelHasTheBytesOfItsFormat) {
    const std::pair<PixelFormat, uint32_t> kFormats[] = {{22, 8}, {1, 4}, {2, 4}, {5, 4}, {43, 4},
                                                         {3, 3},  {4, 2}, {0, 0}, {6, 0}, {-1, 0}};
    for (const auto& [format, bytes] : kFormats) EXPECT_EQ(bytesPerPixel(format), bytes) << format;
}

template <typename Listener>
void serveOneCapture() {
    const sp<Listener> listener = new Listener;
    EXPECT_TRUE(listener->onScreenCaptureCompleted({}).isOk());
    EXPECT_EQ(listener->waitForResults().result, OK);
}

TEST(PlatformHeadersTest, TheLibrarysListenerStandsBesideThePlatforms) {
    static_assert(!std::is_same_v<sensor_priv::SyncScreenCaptureListener, PlatformsListener>);
    serveOneCapture<sensor_priv::SyncScreenCaptureListener>();
    serveOneCapture<PlatformsListener>();
}

}  // namespace
}  // namespace android
