#include "record/Courier.h"

#include "core/SensorHandlerThread.h"
#include "record/Recorder.h"

namespace record {

void Courier::handleMessage(const android::Message& message) {
    switch (mRecorder->beginMessage(&mRun)) {
        case Timeline::Turn::kNever:
            break;
        case Timeline::Turn::kLater:
            mThread->sendMessage(this, message.what);
            break;
        case Timeline::Turn::kNow: {
            const Run::Scope scope(&mRun);
            mHandler->handleMessage(message);
        }
            mRecorder->end(&mRun);
            break;
    }
}

}  // namespace record
