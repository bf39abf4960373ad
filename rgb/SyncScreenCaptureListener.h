#pragma once

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
    /** The platform calls this once, on a binder thread. A second call ends the process. */
    binder::Status onScreenCaptureCompleted(const gui::ScreenCaptureResults& results) override;

    /**
     * Blocks until the results are there and their buffer is complete, without a time-out. A second
     * call ends the process.
     */
    gui::ScreenCaptureResults waitForResults();

private:
    std::promise<gui::ScreenCaptureResults> mResults;
};

}  // namespace sensor_priv

}  // namespace android
