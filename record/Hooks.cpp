#include <optional>
#include <vector>

#include <cutils/properties.h>
#include <time.h>
#include <utils/Looper.h>

#include "core/Export.h"
#include "core/SensorHandlerThread.h"
#include "record/Library.h"
#include "record/Recorder.h"

// What the library calls, under the same names: the library finds these first. What others call
// under these names is only handed on.

using record::Recorder;
using record::Run;

/** Telemetry. */
extern "C" SENSOR_PRIV_EXPORT void track_event(const char* moduleId, const char* eventId,
                                               const char* payload) {
    using Function = void (*)(const char*, const char*, const char*);
    static const auto next = reinterpret_cast<Function>(record::findNext("track_event"));
    Run* const run = Run::current();
    if (Recorder* recorder = run != nullptr ? Recorder::get() : nullptr) {
        recorder->expectEvent(run, moduleId, eventId, payload);
    }
    const Run::Outside outside;
    next(moduleId, eventId, payload);
}

extern "C" SENSOR_PRIV_EXPORT int property_set(const char* key, const char* value) {
    using Function = int (*)(const char*, const char*);
    static const auto next = reinterpret_cast<Function>(record::findNext("property_set"));
    Run* const run = Run::current();
    if (Recorder* recorder = run != nullptr ? Recorder::get() : nullptr) {
        recorder->expectProperty(run, key, value);
    }
    const Run::Outside outside;
    return next(key, value);
}

/** In a run the monotonic clock stands still for its thread. */
extern "C" SENSOR_PRIV_EXPORT int clock_gettime(clockid_t clock, timespec* time) noexcept(
        noexcept(::clock_gettime(clock, time))) {
    constexpr int64_t kNsPerSecond = 1'000'000'000;
    if (const Run* run = Run::current();
        run != nullptr && run->clockStands && clock == CLOCK_MONOTONIC) {
        time->tv_sec = static_cast<time_t>(run->now / kNsPerSecond);
        time->tv_nsec = static_cast<long>(run->now % kNsPerSecond);
        return 0;
    }
    using Function = int (*)(clockid_t, timespec*);
    static const auto next = reinterpret_cast<Function>(record::findNext("clock_gettime"));
    return next(clock, time);
}

namespace android {

// Messages. They take a way round by the recorder, which then knows when they run.

namespace {

/** Posts by way of the recorder what the library posts in a run, other messages as they are. */
class Posting {
public:
    Posting(SensorHandlerThread* thread, const sp<MessageHandler>& handler, int what, int delayMs)
          : mRun(Run::current()),
            mReceiver(handler) {
        Recorder* const recorder = mRun != nullptr ? Recorder::getOnceStarted() : nullptr;
        if (recorder == nullptr) return;
        mRun->onCall();
        mReceiver = recorder->post(*mRun, thread, handler, what, delayMs);
        // The Looper sorts by time: calls of the same time get a nanosecond each.
        mOrder = mRun->order;
        mRun->now += mOrder;
    }
    ~Posting() {
        if (mRun != nullptr) mRun->now -= mOrder;
    }
    Posting(const Posting&) = delete;
    Posting& operator=(const Posting&) = delete;

    const sp<MessageHandler>& receiver() const { return mReceiver; }

private:
    Run* const mRun;
    sp<MessageHandler> mReceiver;
    int32_t mOrder = 0;
};

/** The handlers that the messages of `handler` may have been posted to. */
std::vector<sp<MessageHandler>> receiversOf(const sp<MessageHandler>& handler,
                                            std::optional<int> what) {
    std::vector<sp<MessageHandler>> receivers{handler};
    Recorder* const recorder = Recorder::getOnceStarted();
    if (recorder == nullptr) return receivers;
    for (const auto& courier : recorder->remove(Run::current(), handler, what)) {
        receivers.push_back(courier);
    }
    return receivers;
}

}  // namespace

void SensorHandlerThread::sendMessage(const sp<MessageHandler>& handler, int what) {
    static const auto next = record::real(&SensorHandlerThread::sendMessage);
    const Posting posting(this, handler, what, 0);
    next(this, posting.receiver(), what);
}

void SensorHandlerThread::sendMessageDelayed(const sp<MessageHandler>& handler, int what,
                                             int delayMs) {
    static const auto next = record::real(&SensorHandlerThread::sendMessageDelayed);
    const Posting posting(this, handler, what, delayMs);
    next(this, posting.receiver(), what, delayMs);
}

void SensorHandlerThread::removeMessage(const sp<MessageHandler>& handler, int what) {
    static const auto next = record::real(&SensorHandlerThread::removeMessage);
    for (const auto& receiver : receiversOf(handler, what)) next(this, receiver, what);
}

void SensorHandlerThread::removeAllMessages(const sp<MessageHandler>& handler) {
    static const auto next = record::real(&SensorHandlerThread::removeAllMessages);
    for (const auto& receiver : receiversOf(handler, std::nullopt)) next(this, receiver);
}

}  // namespace android
