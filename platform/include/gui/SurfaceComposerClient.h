#pragma once

#include <vector>

#include <android/gui/IScreenCaptureListener.h>
#include <binder/IBinder.h>
#include <stdint.h>
#include <ui/DisplayId.h>
#include <ui/DisplayState.h>
#include <ui/GraphicTypes.h>
#include <ui/Rect.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>

namespace android {

namespace gui {

/** What to capture, and how. */
struct CaptureArgs {
    const static int32_t UNSET_UID = -1;
    virtual ~CaptureArgs() = default;

    ui::PixelFormat pixelFormat{ui::PixelFormat::RGBA_8888};
    Rect sourceCrop;
    float frameScaleX{1};
    float frameScaleY{1};
    bool captureSecureLayers{false};
    int32_t uid{UNSET_UID};
    ui::Dataspace dataspace = ui::Dataspace::UNKNOWN;
    bool allowProtected = false;
    bool grayscale = false;
};

struct DisplayCaptureArgs : CaptureArgs {
    sp<IBinder> displayToken;
    uint32_t width{0};
    uint32_t height{0};
    bool useIdentityTransform{false};
};

}  // namespace gui

using gui::CaptureArgs;
using gui::DisplayCaptureArgs;
using gui::IScreenCaptureListener;

/** The way to the compositor. */
class SurfaceComposerClient : public RefBase {
public:
    /** The token of the internal display, always the same. Null if there is none. */
    static sp<IBinder> getInternalDisplayToken();

    /** The display, if there is one. */
    static std::vector<PhysicalDisplayId> getPhysicalDisplayIds();

    /** The token of a display. Null if it has none, or if there is no such display. */
    static sp<IBinder> getPhysicalDisplayToken(PhysicalDisplayId displayId);

    /** Sets `*state`. NAME_NOT_FOUND if the token is no display's. The display never turns. */
    static status_t getDisplayState(const sp<IBinder>& display, ui::DisplayState* state);
};

class ScreenshotClient {
public:
    /**
     * Starts a capture and returns. On success the listener is told later, on another thread: once,
     * unless the display has a fault. After an error it is never told. BAD_VALUE if the token or
     * the listener is null.
     */
    static status_t captureDisplay(const DisplayCaptureArgs& captureArgs,
                                   const sp<IScreenCaptureListener>& captureListener);
};

}  // namespace android
