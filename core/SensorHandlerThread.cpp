#include "core/SensorHandlerThread.h"

#include <cstdint>
#include <limits>

#include <utils/Errors.h>

#include "core/Log.h"

namespace android {

Mutex SensorHandlerThread::sLock;
SensorHandlerThread* SensorHandlerThread::mHandlerThread = nullptr;

SensorHandlerThread* SensorHandlerThread::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mHandlerThread == nullptr) {
        mHandlerThread = new SensorHandlerThread("sensor_native_handler", 0);
        // The thread holds the only other reference. This one keeps the instance, and what is
        // still posted to it, valid after `quit()`.
        mHandlerThread->incStrong(nullptr);
    }
    return mHandlerThread;
}

SensorHandlerThread::SensorHandlerThread(const char* name, int priority)
      : Thread(/*canCallJava=*/true),
        mLooper(new Looper(/*allowNonCallbacks=*/false)),
        mQuit(false) {
    // If the thread cannot be created, `run` drops the reference that it took. Without this one,
    // that would destroy the object under construction.
    incStrong(this);
    if (run(name, priority, 0) == OK) {
        decStrong(this);  // the thread holds its own
    } else {
        SENSOR_PRIV_LOGE("%s: the thread cannot be created", name);
    }
}

SensorHandlerThread::~SensorHandlerThread() {
    // Does not join: the thread itself may drop the last reference.
    quit();
}

// Each operation first wakes the loop, although the Looper wakes itself for a new first message.
// The extra wake is kept: after it, the loop rounds its wait anew.
void SensorHandlerThread::sendMessage(const sp<MessageHandler>& handler, int what) {
    mLooper->wake();
    mLooper->sendMessage(handler, Message(what));
}

void SensorHandlerThread::sendMessageDelayed(const sp<MessageHandler>& handler, int what,
                                             int delayMs) {
    mLooper->wake();
    mLooper->sendMessageDelayed(int64_t{delayMs} * 1'000'000, handler, Message(what));
}

void SensorHandlerThread::removeMessage(const sp<MessageHandler>& handler, int what) {
    mLooper->wake();
    mLooper->removeMessages(handler, what);
}

void SensorHandlerThread::removeAllMessages(const sp<MessageHandler>& handler) {
    mLooper->wake();
    mLooper->removeMessages(handler);
}

bool SensorHandlerThread::threadLoop() {
    do {
        // The longest time-out, not -1: the loop turns once in 24.8 days.
        mLooper->pollOnce(std::numeric_limits<int>::max());
    } while (!mQuit && !exitPending());
    return false;
}

void SensorHandlerThread::quit() {
    // Threads that pass this test together wake the loop more than once, which does no harm.
    if (mQuit) return;
    mQuit = true;
    mLooper->wake();
}

}  // namespace android
