#pragma once

#include <utils/Looper.h>
#include <utils/StrongPointer.h>

#include "record/Run.h"

namespace android {
class SensorHandlerThread;
}

namespace record {

class Recorder;

/** Carries one message of the library's to its handler, and tells the recorder when it runs. */
class Courier : public android::MessageHandler {
public:
    using Handler = android::sp<android::MessageHandler>;

    Courier(Recorder* recorder, android::SensorHandlerThread* thread, Handler handler)
          : mRecorder(recorder),
            mThread(thread),
            mHandler(std::move(handler)),
            mRun(this) {}

    Run* run() { return &mRun; }

    /** The one that carries the message of `run`. */
    static Courier* of(Run* run) { return static_cast<MessageRun*>(run)->courier; }

    void handleMessage(const android::Message& message) override;

private:
    struct MessageRun final : public Run {
        explicit MessageRun(Courier* owner) : courier(owner) {}
        Courier* const courier;
    };

    Recorder* const mRecorder;
    android::SensorHandlerThread* const mThread;
    const Handler mHandler;
    MessageRun mRun;
    int mYields = 0;  // how often others have come first
};

}  // namespace record
