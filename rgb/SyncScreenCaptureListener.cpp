#include "rgb/SyncScreenCaptureListener.h"

#include <ui/Fence.h>

namespace android {

inline namespace sensor_priv {

binder::Status SyncScreenCaptureListener::onScreenCaptureCompleted(
        const gui::ScreenCaptureResults& results) {
    mResults.set_value(results);
    return binder::Status::ok();
}

gui::ScreenCaptureResults SyncScreenCaptureListener::waitForResults() {
    gui::ScreenCaptureResults results = mResults.get_future().get();
    results.fence->waitForever("");  // a name for the platform's log; none is needed
    return results;
}

}  // namespace sensor_priv

}  // namespace android
