#include <cstdarg>
#include <optional>
#include <vector>

#include <android/log.h>
#include <cutils/properties.h>
#include <time.h>
#include <utils/Looper.h>

#include "base/Calendar.h"
#include "core/Export.h"
#include "core/SensorHandlerThread.h"
#include "record/Library.h"
#include "record/Recorder.h"

// What the library calls, under the same names: the library finds these first. What others call
// under these names is only handed on.

using record::Found;
using record::Recorder;
using record::Stint;

namespace {

/**
 * The library calls somebody else's code. That code is no part of the stint: it sees the real
 * clock, its calls come from outside, and nobody waits for it.
 */
class Outside {
public:
    Outside() : mStint(Stint::current()), mScope(nullptr) {
        if (mStint != nullptr) mStint->outsideSince = record::realNow();
    }
    ~Outside() {
        if (mStint != nullptr) mStint->outsideSince = 0;
    }
    Outside(const Outside&) = delete;
    Outside& operator=(const Outside&) = delete;

private:
    Stint* const mStint;
    const Stint::Scope mScope;
};

}  // namespace

/** Telemetry. */
extern "C" SENSOR_PRIV_EXPORT void track_event(const char* moduleId, const char* eventId,
                                               const char* payload) {
    static Found<void (*)(const char*, const char*, const char*)> found;
    const auto next = record::next(&found, "track_event");
    Stint* const stint = Stint::current();
    if (Recorder* recorder = stint != nullptr ? Recorder::get() : nullptr) {
        recorder->expectEvent(stint, moduleId, eventId, payload);
    }
    const Outside outside;
    next(moduleId, eventId, payload);
}

extern "C" SENSOR_PRIV_EXPORT int property_set(const char* key, const char* value) {
    static Found<int (*)(const char*, const char*)> found;
    const auto next = record::next(&found, "property_set");
    Stint* const stint = Stint::current();
    Recorder* const recorder = stint != nullptr ? Recorder::get() : nullptr;
    if (recorder == nullptr) {
        const Outside outside;
        return next(key, value);
    }
    recorder->expectProperty(stint, key, value);
    int status = 0;
    {
        const Outside outside;
        status = next(key, value);
    }
    recorder->endProperty(key);
    return status;
}

/** The log may be the host's own code. */
extern "C" SENSOR_PRIV_EXPORT int __android_log_print(int level, const char* tag,
                                                      const char* format, ...) {
    const Outside outside;
    va_list arguments;
    va_start(arguments, format);
    const int status = __android_log_vprint(level, tag, format, arguments);
    va_end(arguments);
    return status;
}

/** In a stint the monotonic clock stands still for its thread. */
extern "C" SENSOR_PRIV_EXPORT int clock_gettime(clockid_t clock, timespec* time) noexcept(
        noexcept(::clock_gettime(clock, time))) {
    Stint* const stint = clock == CLOCK_MONOTONIC ? Stint::current() : nullptr;
    if (stint == nullptr) {
        static Found<int (*)(clockid_t, timespec*)> found;
        return record::next(&found, "clock_gettime")(clock, time);
    }
    const int64_t now = stint->clock(record::realNow());
    time->tv_sec = static_cast<time_t>(now / base::kNsPerSecond);
    time->tv_nsec = static_cast<long>(now % base::kNsPerSecond);
    return 0;
}

namespace record {

int64_t realNow() {
    // By its name, and in no stint: a program may have a clock of its own in front of the recorder.
    const Stint::Scope noStint(nullptr);
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return int64_t{now.tv_sec} * base::kNsPerSecond + now.tv_nsec;
}

}  // namespace record

namespace android {

// Messages. They take a way round by the recorder, which then knows when they run.

namespace {

/** Posts by way of the recorder what the library posts in a stint, other messages as they are. */
class Posting {
public:
    Posting(SensorHandlerThread* thread, const sp<MessageHandler>& handler, int what, int delayMs)
          : mStint(Stint::current()),
            mReceiver(handler) {
        Recorder* const recorder = mStint != nullptr ? Recorder::getOnceStarted() : nullptr;
        if (recorder == nullptr) return;
        mStint->onCall();
        static_cast<void>(mStint->clock(record::realNow()));  // no message is posted long ago
        mReceiver = recorder->post(*mStint, thread, handler, what, delayMs);
        // The Looper sorts by time: calls of the same time get a nanosecond each.
        mOrder = mStint->order;
        mStint->now += mOrder;
    }
    ~Posting() {
        if (mStint != nullptr) mStint->now -= mOrder;
    }
    Posting(const Posting&) = delete;
    Posting& operator=(const Posting&) = delete;

    const sp<MessageHandler>& receiver() const { return mReceiver; }

private:
    Stint* const mStint;
    sp<MessageHandler> mReceiver;
    int32_t mOrder = 0;
};

/** The handlers that the messages of `handler` may have been posted to. */
std::vector<sp<MessageHandler>> receiversOf(const sp<MessageHandler>& handler,
                                            std::optional<int> what) {
    std::vector<sp<MessageHandler>> receivers{handler};
    Recorder* const recorder = Recorder::getOnceStarted();
    if (recorder == nullptr) return receivers;
    for (const auto& courier : recorder->remove(Stint::current(), handler, what)) {
        receivers.push_back(courier);
    }
    return receivers;
}

}  // namespace

void SensorHandlerThread::sendMessage(const sp<MessageHandler>& handler, int what) {
    const auto next = record::real<&SensorHandlerThread::sendMessage>();
    const Posting posting(this, handler, what, 0);
    next(this, posting.receiver(), what);
}

void SensorHandlerThread::sendMessageDelayed(const sp<MessageHandler>& handler, int what,
                                             int delayMs) {
    const auto next = record::real<&SensorHandlerThread::sendMessageDelayed>();
    const Posting posting(this, handler, what, delayMs);
    next(this, posting.receiver(), what, delayMs);
}

void SensorHandlerThread::removeMessage(const sp<MessageHandler>& handler, int what) {
    const auto next = record::real<&SensorHandlerThread::removeMessage>();
    for (const auto& receiver : receiversOf(handler, what)) next(this, receiver, what);
}

void SensorHandlerThread::removeAllMessages(const sp<MessageHandler>& handler) {
    const auto next = record::real<&SensorHandlerThread::removeAllMessages>();
    for (const auto& receiver : receiversOf(handler, std::nullopt)) next(this, receiver);
}

}  // namespace android
