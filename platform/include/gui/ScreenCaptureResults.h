#pragma once

#include <ui/Fence.h>
#include <ui/GraphicBuffer.h>
#include <ui/GraphicTypes.h>
#include <utils/Errors.h>
#include <utils/StrongPointer.h>

namespace android::gui {

/** What a capture has led to. If `result` is not `OK`, there may be no buffer. */
struct ScreenCaptureResults {
    sp<GraphicBuffer> buffer;
    sp<Fence> fence = Fence::NO_FENCE;  // signals when the buffer's contents are complete
    bool capturedSecureLayers{false};
    ui::Dataspace capturedDataspace{ui::Dataspace::V0_SRGB};
    status_t result = OK;
};

}  // namespace android::gui
