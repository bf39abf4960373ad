#pragma once

#include <future>

#include <android/gui/BnScreenCaptureListener.h>
#include <binder/Status.h>
#include <gui/ScreenCaptureResults.h>

namespace android {

/**
 * The platform's own listener that waits for one capture. The library has a class of the same name;
 * this one shows that a file may include both.
 */
class SyncScreenCaptureListener : public gui::BnScreenCaptureListener {
public:
    binder::Status onScreenCaptureCompleted(const gui::ScreenCaptureResults& results) override {
        mResults.set_value(results);
        return binder::Status::ok();
    }

    gui::ScreenCaptureResults waitForResults() {
        gui::ScreenCaptureResults results = mResults.get_future().get();
        results.fence->waitForever("");
        return results;
    }

private:
    std::promise<gui::ScreenCaptureResults> mResults;
};

}  // namespace android
