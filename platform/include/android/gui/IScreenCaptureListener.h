#pragma once

#include <binder/Status.h>
#include <gui/ScreenCaptureResults.h>
#include <utils/RefBase.h>

namespace android::gui {

/** Is told when a capture is complete. */
class IScreenCaptureListener : public virtual RefBase {
public:
    virtual ::android::binder::Status onScreenCaptureCompleted(
            const ::android::gui::ScreenCaptureResults& captureResults) = 0;
};

}  // namespace android::gui
