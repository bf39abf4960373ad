/**
 * The library's capture on every form of the platform's calls. Behind each form stand the calls of
 * platform/Graphics.cpp, with a display whose content is turned and a second display beside it.
 */

#include "rgb/CaptureForms.h"

#include <algorithm>
#include <array>
#include <random>
#include <type_traits>
#include <utility>

#include <android/gui/BnScreenCaptureListener.h>

#include "platform/Display.h"
#include "tests/DeviceTest.h"
#include "tests/Pictures.h"
#include "tests/forms/Requests.h"

namespace {

using namespace form;
using android::BAD_VALUE;
using android::OK;
using android::Rect;
using android::ui::Rotation;
using platform::DisplayChange;
using platform::DisplayFault;
using platform::Picture;

using Rgb = std::array<int, 3>;
using Rectangle = std::array<int, 4>;

/** The internal display: what its panel shows, and how far its content is turned. */
struct {
    Picture panel = {1, 1, {0, 0, 0, 0}};
    int quarterTurns = 0;
    bool hasState = true;
} display;

/** The panel as its content sees it, turned back. */
Picture present() {
    const auto [width, height, pixels] = display.panel;
    Picture turned = display.panel;
    if (display.quarterTurns % 2 != 0) std::swap(turned.width, turned.height);
    for (uint32_t y = 0; y < height; ++y) {
        for (uint32_t x = 0; x < width; ++x) {
            const std::pair<uint32_t, uint32_t> kPlaces[] = {{x, y},
                                                             {y, width - 1 - x},
                                                             {width - 1 - x, height - 1 - y},
                                                             {height - 1 - y, x}};
            const auto [toX, toY] = kPlaces[display.quarterTurns];
            std::copy_n(&pixels[size_t{4} * (y * width + x)], 4,
                        &turned.pixels[size_t{4} * (toY * turned.width + toX)]);
        }
    }
    return turned;
}

class OtherToken : public IBinder {};

bool turnsCrop(const DisplayCaptureArgs12& request) {
    return request.useIdentityTransform;
}
bool turnsCrop(const DisplayCaptureArgs14Qpr3&) {
    return false;
}
template <typename CaptureArgs>
bool turnsCrop(const DisplayCaptureArgs15Qpr1<CaptureArgs>&) {
    return false;
}

const CaptureArgs12& common(const CaptureArgs12& request) {
    return request;
}
template <typename CaptureArgs>
const CaptureArgs& common(const DisplayCaptureArgs15Qpr1<CaptureArgs>& request) {
    return request.captureArgs;
}

template <typename CaptureArgs>
bool isSecure(const CaptureArgs& args) {
    return args.captureSecureLayers;
}
bool isSecure(const CaptureArgs16Qpr2& args) {
    return args.secureLayerMode == SecureLayerMode::Capture;
}

void setFence(const android::gui::ScreenCaptureResults& from, Results12* to) {
    to->fence = from.fence;
    to->result = from.result;
}
void setFence(const android::gui::ScreenCaptureResults& from, Results14* to) {
    to->fenceResult = from.fence;
    if (from.result != OK) to->fenceResult = android::base::unexpected(from.result);
}

/** Tells a form's listener in its form. */
template <typename Listener, typename Results>
class Forwarder : public android::gui::BnScreenCaptureListener {
public:
    explicit Forwarder(const sp<Listener>& listener) : mListener(listener) {}

    android::binder::Status onScreenCaptureCompleted(
            const android::gui::ScreenCaptureResults& captured) override {
        Results results;
        results.buffer = captured.buffer;
        setFence(captured, &results);
        return mListener->onScreenCaptureCompleted(results);
    }

private:
    const sp<Listener> mListener;
};

constexpr char kNoToken[] = "0 log 6 Unable to get handle for display";
constexpr char kNoCapture[] = "0 log 6 UL: captureDisplay failed!";
constexpr char kNoResults[] = "0 log 6 UL: captureResults failed!";
constexpr Rgb kUntouched = {-1, -2, -3};

/** `kUntouched` if the sample fails. */
template <typename Form>
Rgb sample(Rectangle rect) {
    Rgb rgb = kUntouched;
    const int status = getScreenPixcel<Form>(rgb.data(), rect.data());
    EXPECT_EQ(status, rgb != kUntouched);
    return rgb;
}

}  // namespace

namespace form {

sp<IBinder> Displays12::getInternalDisplayToken() {
    return android::SurfaceComposerClient::getInternalDisplayToken();
}

std::vector<PhysicalDisplayId> Displays14::getPhysicalDisplayIds() {
    auto ids = android::SurfaceComposerClient::getPhysicalDisplayIds();
    if (!ids.empty()) ids.push_back({ids.front().value + 1});
    return ids;
}

sp<IBinder> Displays14::getPhysicalDisplayToken(PhysicalDisplayId id) {
    if (id.value != android::SurfaceComposerClient::getPhysicalDisplayIds().at(0).value) {
        return new OtherToken;
    }
    return android::SurfaceComposerClient::getPhysicalDisplayToken(id);
}

status_t Displays14::getDisplayState(const sp<IBinder>& token, android::ui::DisplayState* state) {
    if (!display.hasState) return BAD_VALUE;
    const status_t status = android::SurfaceComposerClient::getDisplayState(token, state);
    const Picture picture = present();
    *state = {Rotation{display.quarterTurns},
              {static_cast<int32_t>(picture.width), static_cast<int32_t>(picture.height)}};
    return status;
}

template <typename Displays, typename Request, typename Results>
status_t Form<Displays, Request, Results>::ScreenshotClient::captureDisplay(
        const Request& request, const sp<IScreenCaptureListener>& listener) {
    DisplayChange change;
    change.picture = turnsCrop(request) ? display.panel : present();
    EXPECT_EQ(changeDisplay(change), std::nullopt);
    const auto& [left, top, right, bottom] = common(request).sourceCrop;
    android::DisplayCaptureArgs args;
    args.sourceCrop = Rect(left, top, right, bottom);
    args.pixelFormat = android::ui::PixelFormat{common(request).pixelFormat};
    args.captureSecureLayers = isSecure(common(request));
    args.displayToken = request.displayToken;
    args.width = static_cast<uint32_t>(request.width);
    args.height = static_cast<uint32_t>(request.height);
    return android::ScreenshotClient::captureDisplay(
            args, new Forwarder<IScreenCaptureListener, Results>(listener));
}

// For the forms' own programs.
template struct Form<Displays12, DisplayCaptureArgs12, Results12>;
template struct Form<Displays14, DisplayCaptureArgs12, Results14>;
template struct Form<Displays14, DisplayCaptureArgs14Qpr3, Results14>;
template struct Form<Displays14, DisplayCaptureArgs15Qpr1<CaptureArgs15Qpr1>, Results14>;
template struct Form<Displays14, DisplayCaptureArgs15Qpr1<CaptureArgs16Qpr2>, Results14>;

namespace {

template <typename Form>
class CaptureFormsTest : public DeviceTest {
protected:
    CaptureFormsTest() { taken(); }
};

using Forms = ::testing::Types<Form12, Form14, Form14Qpr3, Form15, Form15Qpr1, Form16Qpr2>;
TYPED_TEST_SUITE(CaptureFormsTest, Forms, );

TYPED_TEST(CaptureFormsTest, ASampleStaysInItsPlaceWhenTheContentTurns) {
    std::mt19937 random(1);
    for (int round = 0; round < 200; ++round) {
        // Upright or lying, as it is installed.
        display.panel = round % 8 < 4 ? randomPicture(20, 45, 2) : randomPicture(45, 20, 3);
        display.quarterTurns = round % 4;
        const int left = static_cast<int>(random() % 60) - 10;
        const int top = static_cast<int>(random() % 60) - 10;
        const Rectangle rect = {left, top, left + 1 + static_cast<int>(random() % 30),
                                top + 1 + static_cast<int>(random() % 30)};
        ASSERT_EQ(sample<TypeParam>(rect), averageOf(display.panel, rect))
                << display.quarterTurns << ::testing::PrintToString(rect);
    }
}

TYPED_TEST(CaptureFormsTest, FailuresEndAlike) {
    const std::pair<DisplayFault, const char*> kFaults[] = {
            {DisplayFault::kToken, kNoToken},      {DisplayFault::kNoDisplay, kNoToken},
            {DisplayFault::kCapture, kNoCapture},  {DisplayFault::kResults, kNoResults},
            {DisplayFault::kListener, kNoResults}, {DisplayFault::kTwice, kNoResults},
            {DisplayFault::kFence, kNoResults},
    };
    DisplayChange change;
    for (const auto& [fault, log] : kFaults) {
        change.fault = fault;
        changeDisplay(change);
        EXPECT_EQ(sample<TypeParam>({0, 0, 1, 1}), kUntouched);
        EXPECT_EQ(this->taken(), Lines{log});
    }
    change.fault = DisplayFault::kNone;
    changeDisplay(change);
    EXPECT_EQ(sample<TypeParam>({0, 0, 1, 1}), Rgb{});
    display.hasState = false;
    sample<TypeParam>({0, 0, 1, 1});
    const bool asksForState =
            !std::is_same_v<typename TypeParam::DisplayCaptureArgs, DisplayCaptureArgs12>;
    EXPECT_EQ(this->taken(), asksForState ? Lines{kNoCapture} : Lines{});
}

Rectangle toPresent(const Rectangle& area, Rotation orientation, const android::ui::Size& size) {
    const auto [left, top, right, bottom] = android::forms::toPresent(
            Rect(area[0], area[1], area[2], area[3]), android::ui::DisplayState{orientation, size});
    return {left, top, right, bottom};
}

TEST(CaptureFormsTest, ACropTurnsWithTheContentOfTheDisplay) {
    const struct {
        Rotation orientation;
        android::ui::Size size;
        Rectangle panel;
        Rectangle present;
    } kCases[] = {
            // 1080 x 2400, installed upright. The camera's corner, which is at the top left.
            {Rotation::Rotation0, {1080, 2400}, {10, 20, 40, 60}, {10, 20, 40, 60}},
            {Rotation::Rotation90, {2400, 1080}, {10, 20, 40, 60}, {20, 1040, 60, 1070}},
            {Rotation::Rotation180, {1080, 2400}, {10, 20, 40, 60}, {1040, 2340, 1070, 2380}},
            {Rotation::Rotation270, {2400, 1080}, {10, 20, 40, 60}, {2340, 10, 2380, 40}},
            // 1920 x 1200, installed lying.
            {Rotation::Rotation90, {1200, 1920}, {0, 0, 1920, 1}, {0, 0, 1, 1920}},
            {Rotation::Rotation180, {1920, 1200}, {0, 0, 1920, 1}, {0, 1199, 1920, 1200}},
            {Rotation::Rotation270, {1200, 1920}, {0, 0, 1920, 1}, {1199, 0, 1200, 1920}},
            // Over the edges.
            {Rotation::Rotation90, {9, 5}, {-3, -2, 7, 11}, {-2, -2, 11, 8}},
    };
    for (const auto& [orientation, size, panel, expected] : kCases) {
        EXPECT_EQ(toPresent(panel, orientation, size), expected);
    }
    std::mt19937 random(1);
    const auto any = [&random] { return static_cast<int>(random()); };
    for (int round = 0; round < 100; ++round) {
        const Rectangle area = {any(), any(), any(), any()};
        const android::ui::Size size = {any() & 0xffff, any() & 0xffff};
        const android::ui::Size lying = {size.height, size.width};
        const auto half = toPresent(area, Rotation::Rotation180, size);
        const auto left = toPresent(area, Rotation::Rotation90, lying);
        EXPECT_EQ(toPresent(half, Rotation::Rotation180, size), area);
        EXPECT_EQ(toPresent(left, Rotation::Rotation270, size), area);
        EXPECT_EQ(toPresent(left, Rotation::Rotation90, size), half);
    }
}

}  // namespace

}  // namespace form
