#include "record/Courier.h"

#include "core/SensorHandlerThread.h"
#include "record/Recorder.h"

namespace record {

namespace {

/** Nobody waits for ever for a message that does not come. */
constexpr int kMostYields = 100;

}  // namespace

void Courier::handleMessage(const android::Message& message) {
    switch (mRecorder->beginMessage(&mStint, mYields < kMostYields)) {
        case LineTimes::Turn::kNever:
            return;
        case LineTimes::Turn::kLater:
            ++mYields;
            return mThread->sendMessage(this, message.what);
        case LineTimes::Turn::kNow:
            break;
    }
    {
        const Stint::Scope scope(&mStint);
        mHandler->handleMessage(message);
    }
    mRecorder->endMessage(&mStint);
}

}  // namespace record
