#pragma once

#include <atomic>
#include <future>

#include <android/gui/BnScreenCaptureListener.h>
#include <binder/Status.h>
#include <gui/ScreenCaptureResults.h>

#include "core/Export.h"

namespace android {

// The platform's gui library has an `android::SyncScreenCaptureListener` too. The inline namespace
// keeps the two apart where a file or a process holds both.
inline namespace sensor_priv {

/** Lets one thread wait for one capture that the platform completes on another thread. */
class SENSOR_PRIV_HIDDEN SyncScreenCaptureListener : public gui::BnScreenCaptureListener {
public:
    /**
     * The platform calls this on a binder thread. The first call counts. Version 16.0 may call it a
     * second time for a capture that has failed.
     */
    binder::Status onScreenCaptureCompleted(const gui::ScreenCaptureResults& results) override;

    /**
     * Blocks until the results are there and their buffer is complete, without a time-out. They
     * have failed if their buffer cannot be waited for. A second call ends the process.
     */
    gui::ScreenCaptureResults waitForResults();

private:
    std::promise<gui::ScreenCaptureResults> mResults;
    std::atomic<bool> mIsComplete{false};
};

}  // namespace sensor_priv

}  // namespace android
