#pragma once

/**
 * The capture calls in the forms that platform versions give them. platform/include has 13's form.
 * The folders beside this file have headers by their platform names, which put the form
 * PLATFORM_FORM in the platform's place: those in all/ for each, the others from a version on.
 */

#include <cstdint>
#include <vector>

#include <android-base/expected.h>
#include <binder/IBinder.h>
#include <binder/Status.h>
#include <ui/DisplayId.h>
#include <ui/DisplayState.h>
#include <ui/Fence.h>
#include <ui/GraphicBuffer.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>
#include <utils/StrongPointer.h>

namespace form {

using android::Fence;
using android::GraphicBuffer;
using android::IBinder;
using android::PhysicalDisplayId;
using android::sp;
using android::status_t;

struct Displays14 {
    static std::vector<PhysicalDisplayId> getPhysicalDisplayIds();
    static sp<IBinder> getPhysicalDisplayToken(PhysicalDisplayId id);
    static status_t getDisplayState(const sp<IBinder>& display, android::ui::DisplayState* state);
};

struct Displays12 : Displays14 {
    static sp<IBinder> getInternalDisplayToken();
};

// Defined in Requests.h, which not every form's gui/SurfaceComposerClient.h includes.
struct DisplayCaptureArgs12;
struct DisplayCaptureArgs14Qpr3;
struct CaptureArgs15Qpr1;
struct CaptureArgs16Qpr2;
template <typename CaptureArgs>
struct DisplayCaptureArgs15Qpr1;

struct Results12 {
    sp<GraphicBuffer> buffer;
    sp<Fence> fence = Fence::NO_FENCE;
    status_t result = android::OK;
};

struct Results14 {
    sp<GraphicBuffer> buffer;
    android::base::expected<sp<Fence>, status_t> fenceResult = Fence::NO_FENCE;
};

template <typename Displays, typename Request, typename Results>
struct Form {
    using SurfaceComposerClient = Displays;
    using DisplayCaptureArgs = Request;
    using ScreenCaptureResults = Results;

    class IScreenCaptureListener : public virtual android::RefBase {
    public:
        virtual android::binder::Status onScreenCaptureCompleted(const Results& results) = 0;
    };
    class BnScreenCaptureListener : public IScreenCaptureListener {};

    struct ScreenshotClient {
        static status_t captureDisplay(const Request& request,
                                       const sp<IScreenCaptureListener>& listener);
    };
};

struct Form12 : Form<Displays12, DisplayCaptureArgs12, Results12> {};
struct Form14 : Form<Displays14, DisplayCaptureArgs12, Results14> {};
struct Form14Qpr3 : Form<Displays14, DisplayCaptureArgs14Qpr3, Results14> {};
struct Form15 : Form<Displays14, DisplayCaptureArgs14Qpr3, Results14> {};
struct Form15Qpr1 : Form<Displays14, DisplayCaptureArgs15Qpr1<CaptureArgs15Qpr1>, Results14> {};
struct Form16Qpr2 : Form<Displays14, DisplayCaptureArgs15Qpr1<CaptureArgs16Qpr2>, Results14> {};

/** `RgbShotManager::getScreenPixcel`, compiled for a form. */
template <typename Form>
int getScreenPixcel(int* rgbOut, int* rect);

}  // namespace form
