#pragma once

#include <stdint.h>

#include <android/gui/IScreenCaptureListener.h>
#include <binder/IBinder.h>
#include <ui/GraphicTypes.h>
#include <ui/Rect.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>

namespace android {

using gui::IScreenCaptureListener;

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

/** The way to the compositor. */
class SurfaceComposerClient : public RefBase {
public:
    /** The token of the internal display, always the same. Null if there is none. */
    static sp<IBinder> getInternalDisplayToken();
};

class ScreenshotClient {
public:
    /**
     * Starts a capture and returns. On success the listener is told once, later, on another
     * thread; after an error it is never told. BAD_VALUE if the token or the listener is null.
     */
    static status_t captureDisplay(const DisplayCaptureArgs& captureArgs,
                                   const sp<IScreenCaptureListener>& captureListener);
};

}  // namespace android
