#pragma once

#include <binder/Parcelable.h>
#include <ui/Fence.h>
#include <ui/GraphicBuffer.h>
#include <ui/GraphicTypes.h>
#include <utils/Errors.h>
#include <utils/StrongPointer.h>

namespace android::gui {

/** The outcome of a capture. If `result` is not `OK`, there may be no buffer. */
struct ScreenCaptureResults : public Parcelable {
    ScreenCaptureResults();
    ~ScreenCaptureResults() override;

    /** Both return INVALID_OPERATION: the host has one process only. */
    status_t writeToParcel(Parcel* parcel) const override;
    status_t readFromParcel(const Parcel* parcel) override;

    sp<GraphicBuffer> buffer;
    sp<Fence> fence = Fence::NO_FENCE;  // signals when the buffer's contents are complete
    bool capturedSecureLayers{false};
    bool capturedHdrLayers{false};
    ui::Dataspace capturedDataspace{ui::Dataspace::V0_SRGB};
    status_t result = OK;
};

}  // namespace android::gui
