#pragma once

#include <utils/Looper.h>
#include <utils/StrongPointer.h>

#include "record/Stint.h"

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
            mStint(this) {}

    Stint* stint() { return &mStint; }

    /** The one that carries the message of `stint`. */
    static Courier* of(Stint* stint) { return static_cast<MessageStint*>(stint)->courier; }

    void handleMessage(const android::Message& message) override;

private:
    struct MessageStint final : public Stint {
        explicit MessageStint(Courier* owner) : courier(owner) {}
        Courier* const courier;
    };

    Recorder* const mRecorder;
    android::SensorHandlerThread* const mThread;
    const Handler mHandler;
    MessageStint mStint;
    int mYields = 0;  // how often others have come first
};

}  // namespace record
