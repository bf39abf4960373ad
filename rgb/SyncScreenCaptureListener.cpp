#include "rgb/SyncScreenCaptureListener.h"

#include "rgb/CaptureForms.h"

namespace android {

inline namespace sensor_priv {

binder::Status SyncScreenCaptureListener::onScreenCaptureCompleted(
        const gui::ScreenCaptureResults& results) {
    if (!mIsComplete.exchange(true)) mResults.set_value(results);
    return binder::Status::ok();
}

gui::ScreenCaptureResults SyncScreenCaptureListener::waitForResults() {
    gui::ScreenCaptureResults results = mResults.get_future().get();
    forms::waitForBuffer(&results);
    return results;
}

}  // namespace sensor_priv

}  // namespace android
