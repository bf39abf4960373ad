#include "record/Courier.h"

#include "core/SensorHandlerThread.h"
#include "record/Recorder.h"

namespace record {

namespace {

/** Nobody waits for ever for a message that does not come. */
constexpr int kMostYields = 100;

}  // namespace

void Courier::handleMessage(const android::Message& message) {
    switch (mRecorder->beginMessage(&mRun, mYields < kMostYields)) {
        case Timeline::Turn::kNever:
            return;
        case Timeline::Turn::kLater:
            ++mYields;
            return mThread->sendMessage(this, message.what);
        case Timeline::Turn::kNow:
            break;
    }
    {
        const Run::Scope scope(&mRun);
        mHandler->handleMessage(message);
    }
    mRecorder->end(&mRun);
}

}  // namespace record
