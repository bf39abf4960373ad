#include "record/Recorder.h"

#include <ctime>

#include <android/log.h>
#include <cutils/properties.h>
#include <pthread.h>
#include <unistd.h>

#include "record/Arguments.h"
#include "record/JsonText.h"
#include "record/Log.h"

namespace record {

namespace {

/** What a part keeps free for what the library does after a call has found room. */
constexpr size_t kReserve = size_t{64} << 10;

int64_t monotonicNow() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return int64_t{now.tv_sec} * 1'000'000'000 + now.tv_nsec;
}

/** For a person who looks for something that happened at a time of the day. */
std::string date() {
    const time_t now = time(nullptr);
    tm parts{};
    char text[32] = {};
    gmtime_r(&now, &parts);
    strftime(text, sizeof(text), "%Y-%m-%dT%H:%M:%SZ", &parts);
    return text;
}

/**
 * Calls often come in quick succession, and a replay cannot put one between two messages of the
 * same moment. So the worker, which is late anyway, lets them pass: it begins when none has come
 * for this long, in microseconds. It does not wait for more than so many turns of that; for calls
 * that have begun and not ended, it waits for more.
 */
constexpr int kQuietUs = 200;
constexpr int kQuietTurns = 20;
constexpr int kMostTurns = 250;

}  // namespace

std::atomic<Recorder*> Recorder::sWriting{nullptr};
std::atomic<Recorder*> Recorder::sStarted{nullptr};
std::atomic<bool> Recorder::sWantsEvents{false};

Recorder* Recorder::get() {
    static const bool started = (start(), true);
    return started ? sWriting.load(std::memory_order_acquire) : nullptr;
}

Recorder* Recorder::getOnceStarted() {
    return sStarted.load(std::memory_order_acquire);
}

void Recorder::start() {
    const Settings settings = Settings::read();
    if (settings.folder.empty()) return;
    auto* const recorder = new Recorder;  // never destroyed: the worker uses it
    if (const auto error = recorder->begin(settings)) {
        __android_log_print(ANDROID_LOG_ERROR, kLogTag, "nothing is recorded: %s", error->c_str());
        delete recorder;
        return;
    }
    sStarted = recorder;
    sWriting = recorder;
    pthread_atfork(nullptr, nullptr, leaveToParent);
}

/** In a forked child, which has no worker, and may have got the lock locked. */
void Recorder::leaveToParent() {
    Recorder* const recorder = sStarted.exchange(nullptr);
    if (recorder == nullptr) return;
    sWriting = nullptr;
    sWantsEvents = false;
    recorder->mParts.close();  // the parent's next process could not write the file otherwise
}

Parts::Error Recorder::begin(const Settings& settings) {
    const android::Mutex::Autolock lock(mLock);
    if (settings.hidesNames) {
        const auto key = Names::loadKey(settings.folder);
        if (!key) return settings.folder + " keeps no key for names";
        mNames = std::make_unique<Names>(*key);
    }
    if (auto error = mParts.open(settings.folder, settings.bytes)) return error;
    if (mParts.isFullFor(kReserve)) {
        if (auto error = mParts.startNext()) return error;
    }
    mText = "# " + date() + ": process " + std::to_string(getpid()) + " begins\n";
    appendStart(mTimeline.next(monotonicNow()));
    if (auto error = mParts.write(mText)) return error;
    mText.clear();
    __android_log_print(ANDROID_LOG_INFO, kLogTag, "recording to %s", mParts.path().c_str());
    return {};
}

void Recorder::beginCall(Run* run, const Call& call) {
    const android::Mutex::Autolock lock(mLock);
    if (!mParts.isOpen()) return;
    const int64_t at = mTimeline.next(monotonicNow());
    if (mParts.isFullFor(call.body.size() + kReserve)) startPart(at);
    if (call.readsProperties) appendAny(at, mSurroundings.takeProperties());
    appendAny(at, mSurroundings.takeVariables());
    if (call.isSample) appendAny(at, mScreen.take(call.rgb, call.rect));
    append(at, call.body);
    write();
    run->clockStands = true;
    mTimeline.beginCall(run);
    mRuns.begin(run);
}

Timeline::Turn Recorder::beginMessage(Run* message, bool canYield) {
    const android::Mutex::Autolock lock(mLock);
    waitForQuiet(*message);
    const Timeline::Turn turn = mTimeline.turnOf(*message);
    if (turn == Timeline::Turn::kNever || (turn == Timeline::Turn::kLater && canYield)) return turn;
    for (Run* run : mTimeline.start(message)) mRuns.begin(run);
    message->clockStands = mParts.isOpen();
    message->tellsMoment = true;
    return Timeline::Turn::kNow;
}

void Recorder::waitForQuiet(const Run& message) {
    for (int turn = 0; turn < kMostTurns && mParts.isOpen(); ++turn) {
        if (mTimeline.hasBegun(message) ||
            mTimeline.isQuiet(monotonicNow(), int64_t{kQuietUs} * 1000)) {
            return;
        }
        if (turn >= kQuietTurns && !mTimeline.hasOpenCalls()) return;
        mLock.unlock();
        usleep(kQuietUs);
        mLock.lock();
    }
}

void Recorder::end(Run* run) {
    const android::Mutex::Autolock lock(mLock);
    if (run->isOrdered && !run->isMessage) mTimeline.endCall(*run, monotonicNow());
    endRun(run);
}

void Recorder::endRun(Run* run) {
    appendAll(mRuns.end(run), run->now);
    write();
}

void Recorder::expectEvent(Run* run, const char* module, const char* id, const char* payload) {
    const std::string text = mNames != nullptr ? mNames->replaceAll(payload) : payload;
    std::string body = R"("expect": {"event": {"module": )";
    appendText(&body, module);
    body += R"(, "id": )";
    appendText(&body, id);
    body += R"(, "payload": )";
    appendText(&body, text);
    expect(run, body + "}}");
}

void Recorder::expectProperty(Run* run, const char* name, const char* value) {
    std::string body = R"("expect": {"property": {"name": )";
    appendText(&body, name);
    body += R"(, "value": )";
    appendText(&body, value);
    expect(run, body + "}}");
    const android::Mutex::Autolock lock(mLock);
    mSurroundings.noteProperty(name, value);
}

void Recorder::expect(Run* run, std::string_view body) {
    const android::Mutex::Autolock lock(mLock);
    if (!mParts.isOpen()) return;
    std::string lines;
    // A line without an action lets a replay come to the message's moment, also at a trace's end.
    if (run->tellsMoment) lines += '\n';
    run->tellsMoment = false;
    lines.append(body).append("\n");
    if (!mRuns.mayWrite(run, lines)) return;
    appendAll(lines, run->now);
    write();
}

android::sp<Courier> Recorder::post(const Run& run, android::SensorHandlerThread* thread,
                                    const Courier::Handler& handler, int what, int delayMs) {
    android::sp<Courier> courier = new Courier(this, thread, handler);
    const android::Mutex::Autolock lock(mLock);
    if (mTimeline.post(courier->run(), handler.get(), what, delayMs, run)) {
        mRuns.begin(courier->run());
    }
    return courier;
}

std::vector<android::sp<Courier>> Recorder::remove(const Run* run, const Courier::Handler& handler,
                                                   std::optional<int> what) {
    const android::Mutex::Autolock lock(mLock);
    std::vector<android::sp<Courier>> couriers;
    for (Run* message : mTimeline.remove(handler.get(), what, run)) {
        couriers.emplace_back(Courier::of(message));
        endRun(message);
    }
    return couriers;
}

void Recorder::noteSingleton(const char* name) {
    const android::Mutex::Autolock lock(mLock);
    mSingletons.push_back(name);
}

void Recorder::noteProximity(bool enabled, const std::string& client) {
    const android::Mutex::Autolock lock(mLock);
    if (enabled) {
        mProximityClients.insert(client);
    } else {
        mProximityClients.erase(client);
    }
    sWantsEvents = !mProximityClients.empty();
}

void Recorder::append(int64_t at, std::string_view body) {
    mText += R"({"at": )";
    appendMs(&mText, at);
    if (!body.empty()) mText.append(", ").append(body);
    mText += "}\n";
}

void Recorder::appendAny(int64_t at, std::string_view body) {
    if (!body.empty()) append(at, body);
}

void Recorder::appendAll(std::string_view bodies, int64_t now) {
    while (!bodies.empty()) {
        const size_t end = bodies.find('\n');
        append(mTimeline.tell(now), bodies.substr(0, end));
        bodies.remove_prefix(end + 1);
    }
}

void Recorder::appendStart(int64_t at) {
    append(at, R"("boot": "device")");
    append(at, mSurroundings.takeProperties());
    appendAny(at, mSurroundings.takeVariables());
}

void Recorder::startPart(int64_t at) {
    if (const auto error = mParts.startNext()) return stop(*error);
    mSurroundings.forget();
    mScreen.forget();
    mText += "# " + date() + ": process " + std::to_string(getpid()) + " goes on in a new part\n";
    appendStart(at);
    for (const char* singleton : mSingletons) append(at, callBody(singleton));
    mText += "# end of its start\n";
}

void Recorder::write() {
    if (mParts.isOpen() && !mText.empty()) {
        if (const auto error = mParts.write(mText)) stop(*error);
    }
    mText.clear();
}

void Recorder::stop(const std::string& error) {
    __android_log_print(ANDROID_LOG_ERROR, kLogTag, "the record has ended: %s", error.c_str());
    mParts.close();
    sWriting = nullptr;
    sWantsEvents = false;
}

}  // namespace record
