#include <optional>

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

sp<MessageHandler> postTo(const sp<MessageHandler>& handler, int what, int delayMs) {
    Run* const run = Run::current();
    Recorder* const recorder = run != nullptr ? Recorder::getOnceStarted() : nullptr;
    if (recorder == nullptr) return handler;
    run->onCall();
    return recorder->post(*run, handler, what, delayMs);
}

sp<MessageHandler> removeFrom(const sp<MessageHandler>& handler, std::optional<int> what) {
    Recorder* const recorder = Recorder::getOnceStarted();
    return recorder != nullptr ? recorder->remove(handler, what) : handler;
}

}  // namespace

void SensorHandlerThread::sendMessage(const sp<MessageHandler>& handler, int what) {
    static const auto next = record::real(&SensorHandlerThread::sendMessage);
    next(this, postTo(handler, what, 0), what);
}

void SensorHandlerThread::sendMessageDelayed(const sp<MessageHandler>& handler, int what,
                                             int delayMs) {
    static const auto next = record::real(&SensorHandlerThread::sendMessageDelayed);
    next(this, postTo(handler, what, delayMs), what, delayMs);
}

void SensorHandlerThread::removeMessage(const sp<MessageHandler>& handler, int what) {
    static const auto next = record::real(&SensorHandlerThread::removeMessage);
    next(this, removeFrom(handler, what), what);
}

void SensorHandlerThread::removeAllMessages(const sp<MessageHandler>& handler) {
    static const auto next = record::real(&SensorHandlerThread::removeAllMessages);
    next(this, removeFrom(handler, std::nullopt));
}

}  // namespace android
