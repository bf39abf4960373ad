#include "record/Recorder.h"

#include <ctime>
#include <limits>
#include <new>
#include <utility>

#include <android/log.h>
#include <pthread.h>
#include <sys/mman.h>
#include <unistd.h>

#include "base/Calendar.h"
#include "base/Json.h"
#include "record/CallText.h"
#include "record/Library.h"
#include "record/Log.h"
#include "trace/TraceWriter.h"

namespace record {

namespace {

/** What a part keeps free for what the library does after a call has found room. */
constexpr size_t kReserve = size_t{64} << 10;

/** While lines are lost, the record is tried to go on this often. */
constexpr int64_t kRetryNs = base::kNsPerSecond;

// Lines are not held back for longer than this for a stint that hangs in somebody else's code, nor
// are more of them than that.
constexpr int64_t kHangNs = 2'000'000'000;
constexpr size_t kMostHeld = size_t{256} << 10;

/** The note of a forked child lies this far ahead of all that its parent has dated. */
constexpr int64_t kChildAheadNs = 2'000'000;

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

// Whole milliseconds: `from` and `to` lie around what they name.
std::string lostNote(int64_t from, int64_t to, const std::string& why) {
    std::string body;
    base::JsonWriter json(&body);
    json.key("note").beginObject().key("lost").beginObject();
    json.member("from", from / base::kNsPerMs);
    json.member("to", (to + base::kNsPerMs - 1) / base::kNsPerMs);
    json.member("why", why).endObject().endObject();
    return body;
}

std::string hangNote(int64_t from) {
    std::string body;
    base::JsonWriter json(&body);
    json.key("note").beginObject().key("hang").beginObject();
    json.member("from", from / base::kNsPerMs).endObject().endObject();
    return body;
}

void appendLine(std::string* text, int64_t at, std::string_view body) {
    base::JsonWriter json(text);
    json.beginObject().member("at", base::Ms{at});
    if (!body.empty()) json.raw(body);
    json.endObject();
    *text += '\n';
}

std::string lineOf(int64_t at, std::string_view body) {
    std::string line;
    appendLine(&line, at, body);
    return line;
}

void log(int level, const std::string& text) {
    __android_log_print(level, kLogTag, "%s", text.c_str());
}

// How the first call settles whether there is a record. A plain lock: it must be there before any
// initialiser has run.
pthread_mutex_t gStartLock = PTHREAD_MUTEX_INITIALIZER;
std::atomic<bool> gIsSettled{false};
thread_local bool tIsSettling = false;

// Of a forked child.
std::atomic<bool> gIsChild{false};
int64_t gForked = 0;  // when

}  // namespace

/** What a forked child shares with its parent, which alone may write lines in order. */
struct Recorder::Shared {
    std::atomic<int64_t> floor;   // no later line of the parent has a time before this
    std::atomic<bool> isWriting;  // the parent may be about to write lines
};

std::atomic<Recorder*> Recorder::sWriting{nullptr};
std::atomic<Recorder*> Recorder::sStarted{nullptr};
std::atomic<bool> Recorder::sWantsEvents{false};
Recorder::Shared* Recorder::sParents = nullptr;

/** Holds the lock. What there is to be said is logged after it: the log may be the host's code. */
class SCOPED_CAPABILITY Recorder::Section {
public:
    explicit Section(Recorder* recorder) ACQUIRE(recorder->mLock) : mRecorder(*recorder) {
        mRecorder.lock();
    }
    ~Section() RELEASE() {
        const std::string said = std::exchange(mRecorder.mSaid, {});
        mRecorder.unlock();
        if (!said.empty()) log(ANDROID_LOG_ERROR, said);
    }
    Section(const Section&) = delete;
    Section& operator=(const Section&) = delete;

private:
    Recorder& mRecorder;
};

void Recorder::lock() {
    mLock.lock();
    if (mShared == nullptr) return;
    mShared->isWriting = true;
    mTimes.raise(mShared->floor);
}

void Recorder::unlock() {
    if (mShared != nullptr) mShared->isWriting = false;
    mLock.unlock();
}

Recorder* Recorder::get() {
    if (!gIsSettled.load(std::memory_order_acquire)) settle();
    return sWriting.load(std::memory_order_acquire);
}

Recorder* Recorder::getForCall() {
    Recorder* const recorder = get();
    if (recorder == nullptr && gIsChild && gIsChild.exchange(false)) sStarted.load()->noteChild();
    return recorder;
}

Recorder* Recorder::getOnceStarted() {
    return sStarted.load(std::memory_order_acquire);
}

/** What is called meanwhile, such as the log function of the host, may call the library. */
void Recorder::settle() {
    if (tIsSettling) return;
    std::string said;
    pthread_mutex_lock(&gStartLock);
    if (!gIsSettled) {
        tIsSettling = true;
        said = start();
        tIsSettling = false;
        gIsSettled.store(true, std::memory_order_release);
    }
    pthread_mutex_unlock(&gStartLock);
    if (!said.empty()) log(sWriting != nullptr ? ANDROID_LOG_INFO : ANDROID_LOG_ERROR, said);
}

/** Returns what is to be logged. */
std::string Recorder::start() {
    const Settings settings = Settings::read();
    if (settings.folder.empty()) return {};
    auto* const recorder = new Recorder;  // never destroyed: the worker uses it
    if (const auto error = recorder->begin(settings)) {
        delete recorder;
        return "nothing is recorded: " + *error;
    }
    sStarted = recorder;
    sWriting = recorder;
    const android::Mutex::Autolock lock(recorder->mLock);
    return "recording to " + recorder->mParts.path();
}

const int Recorder::sForkWatch = pthread_atfork(beforeFork, afterFork, beginChild);

/** A child must not get a lock that another thread holds: that thread is not in the child. */
void Recorder::beforeFork() {
    if (!tIsSettling) pthread_mutex_lock(&gStartLock);
    if (Recorder* const recorder = sStarted) recorder->mLock.lock();
}

void Recorder::afterFork() {
    if (Recorder* const recorder = sStarted) recorder->mLock.unlock();
    if (!tIsSettling) pthread_mutex_unlock(&gStartLock);
}

/** The child has no worker, and its parent goes on with the record. */
void Recorder::beginChild() {
    if (Recorder* const recorder = sWriting.exchange(nullptr)) {
        recorder->mParts.abandon();  // the parent's next process could not write the file otherwise
        recorder->mLoss = Loss{0, {}, true, std::numeric_limits<int64_t>::max()};  // for ever
        recorder->mOrder.clear();
        sWantsEvents = false;
        sParents = std::exchange(recorder->mShared, nullptr);
        gForked = realNow();
        gIsChild = true;
    }
    afterFork();
}

/** The first call in a forked child: the trace says that the child's calls are missing. */
void Recorder::noteChild() {
    if (sParents == nullptr) return;
    const int64_t at = realNow() + kChildAheadNs;
    sParents->floor = at;
    constexpr int kMostWaits = 100;  // the parent may have been killed while it wrote
    for (int i = 0; i < kMostWaits && sParents->isWriting; ++i) usleep(1000);
    const android::Mutex::Autolock lock(mLock);
    const std::string why = "process " + std::to_string(getpid()) +
                            " was forked, and what it calls is not recorded";
    mParts.writeBeside(lineOf(at, lostNote(gForked, at, why)));
}

Error Recorder::begin(const Settings& settings) {
    const android::Mutex::Autolock lock(mLock);
    if (auto error = mParts.open(settings.folder, settings.bytes)) return error;
    if (settings.hidesNames) {
        HashKey key{};
        if (auto error = Pseudonyms::loadKey(settings.folder, &key)) return error;
        mPseudonyms = std::make_unique<Pseudonyms>(key);
    }
    if (mParts.isFullFor(kReserve)) {
        if (auto error = mParts.startNext()) return error;
    }
    void* const memory = mmap(nullptr, sizeof(Shared), PROT_READ | PROT_WRITE,
                              MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory != MAP_FAILED) mShared = new (memory) Shared{};
    mWrittenTo = mPartBegan = mTimes.next(realNow());
    appendStart(mWrittenTo, "begins", {});
    write();
    return {};
}

void Recorder::beginCall(Stint* stint, const CallLine& call) {
    const Section section(this);
    const int64_t real = realNow();
    stint->now = real;
    if (!isReady(real)) return;
    const int64_t at = mTimes.next(real);
    if (mParts.isFullFor(call.body.size() + kReserve)) startPart(at);
    if (call.reads == Reads::kAll) appendAny(at, mSurroundings.takeProperties());
    if (call.reads == Reads::kTestMode) {
        appendAny(at, mSurroundings.takeProperty("persist.sys.skip_restrict"));
    }
    appendAny(at, mSurroundings.takeVariables());
    if (call.isSample) appendAny(at, mScreen.take(call.rgb, call.rect));
    append(at, call.body);
    if (!writeUnharmed()) return;
    stint->clockStands = true;
    stint->generation = mGeneration;
    mTimes.beginCall(stint, real);
    mOrder.begin(stint);
    leaveHanging(real);
}

LineTimes::Turn Recorder::beginMessage(Stint* message, bool canYield) {
    const Section section(this);
    waitForQuiet(*message);
    const LineTimes::Turn turn = mTimes.turnOf(*message);
    if (turn == LineTimes::Turn::kNever) return turn;
    if (turn == LineTimes::Turn::kLater && canYield) return turn;
    for (Stint* stint : mTimes.start(message, realNow())) {
        if (!mLoss) mOrder.begin(stint);
    }
    message->clockStands = !mLoss;
    message->generation = mGeneration;
    message->tellsMoment = true;
    return LineTimes::Turn::kNow;
}

void Recorder::waitForQuiet(const Stint& message) {
    for (int turn = 0; turn < kMostTurns && !mLoss; ++turn) {
        const int64_t real = realNow();
        if (mTimes.hasBegun(message) || mTimes.isQuiet(real, int64_t{kQuietUs} * 1000)) return;
        if (turn >= kQuietTurns && !mTimes.hasOpenCalls(real)) return;
        unlock();
        usleep(kQuietUs);
        lock();
    }
}

void Recorder::end(Stint* stint) {
    const Section section(this);
    mTimes.endCall(*stint, realNow());
    endStint(stint);
}

void Recorder::endMessage(Stint* message) {
    const Section section(this);
    mTimes.endMessage();
    endStint(message);
}

void Recorder::endStint(Stint* stint) {
    appendAll(mOrder.end(stint), stint->now);
    write();
}

void Recorder::expectEvent(Stint* stint, const char* module, const char* id, const char* payload) {
    std::string event;
    base::JsonWriter json(&event);
    if (mPseudonyms != nullptr) {
        trace::writeEvent(&json, module, id, mPseudonyms->replaceIn(payload));
    } else {
        trace::writeEvent(&json, module, id, payload);
    }
    const Section section(this);
    expect(stint, event);
}

void Recorder::expectProperty(Stint* stint, const char* name, const char* value) {
    std::string property;
    base::JsonWriter json(&property);
    trace::writeProperty(&json, name, value);
    const Section section(this);
    mSurroundings.beginWrite(name, value);
    expect(stint, property);
}

void Recorder::endProperty(const char* name) {
    const Section section(this);
    mSurroundings.endWrite(name);
}

void Recorder::expect(Stint* stint, std::string_view body) {
    // What began before a loss is not in the trace, and what it does is not either.
    if (mLoss || stint->generation != mGeneration) return;
    std::string lines;
    // A line without an action lets a replay come to the message's moment, also at a trace's end.
    if (stint->tellsMoment) lines += '\n';
    stint->tellsMoment = false;
    base::JsonWriter(&lines).key("expect").beginObject().raw(body).endObject();
    lines += '\n';
    if (!mOrder.mayWrite(stint, lines)) return leaveHanging(realNow());
    appendAll(lines, stint->now);
    write();
}

/** Writes what is held back for too long, or too much of it. */
void Recorder::leaveHanging(int64_t real) {
    while (Stint* const oldest = mOrder.heldBytes() > 0 ? mOrder.oldest() : nullptr) {
        if (!oldest->isOutside(real, kHangNs) && mOrder.heldBytes() <= kMostHeld) break;
        append(mTimes.tell(mTimes.last()), hangNote(oldest->now));
        appendAll(mOrder.end(oldest), oldest->now);
    }
    write();
}

android::sp<Courier> Recorder::post(const Stint& stint, android::SensorHandlerThread* thread,
                                    const Courier::Handler& handler, int what, int delayMs) {
    android::sp<Courier> courier = new Courier(this, thread, handler);
    const Section section(this);
    const bool isOfThisMoment = mTimes.post(courier->stint(), handler.get(), what, delayMs, stint);
    if (isOfThisMoment && !mLoss) mOrder.begin(courier->stint());
    return courier;
}

std::vector<android::sp<Courier>> Recorder::remove(const Stint* stint,
                                                   const Courier::Handler& handler,
                                                   std::optional<int> what) {
    const Section section(this);
    std::vector<android::sp<Courier>> couriers;
    for (Stint* message : mTimes.remove(handler.get(), what, stint)) {
        couriers.emplace_back(Courier::of(message));
        endStint(message);
    }
    return couriers;
}

void Recorder::noteSingleton(const char* name) {
    const Section section(this);
    mSingletons.push_back(name);
}

void Recorder::noteProximity(bool enabled, const std::string& client) {
    const Section section(this);
    if (enabled) {
        mProximityClients.insert(client);
    } else {
        mProximityClients.erase(client);
    }
    if (sWriting != nullptr) sWantsEvents = !mProximityClients.empty();
}

void Recorder::append(int64_t at, std::string_view body) {
    appendLine(&mText, at, body);
}

void Recorder::appendAny(int64_t at, std::string_view body) {
    if (!body.empty()) append(at, body);
}

void Recorder::appendAll(std::string_view bodies, int64_t now) {
    while (!bodies.empty()) {
        const size_t end = bodies.find('\n');
        append(mTimes.tell(now), bodies.substr(0, end));
        bodies.remove_prefix(end + 1);
    }
}

/** The start of a process, with `note` in its first line if that is not "". */
void Recorder::appendStart(int64_t at, const char* how, const std::string& note) {
    mSurroundings.forget();
    mScreen.forget();
    mText += "# " + date() + ": process " + std::to_string(getpid()) + ' ' + how + '\n';
    std::string boot;
    base::JsonWriter json(&boot);
    json.member("boot", "device");
    if (!note.empty()) json.raw(note);
    append(at, boot);
    append(at, mSurroundings.takeProperties());
    appendAny(at, mSurroundings.takeVariables());
    for (const char* singleton : mSingletons) append(at, callBody(singleton));
}

void Recorder::startPart(int64_t at) {
    if (const auto error = mParts.startNext()) {
        return lose("cannot go on in a new part: " + *error);
    }
    mPartBegan = at;
    appendStart(at, "goes on in a new part", {});
    mText += "# end of its start\n";
}

/** Whether there is a record to write to. If lines are being lost, tries to go on with it. */
bool Recorder::isReady(int64_t real) {
    findHarm();
    return !mLoss || goOn(real);
}

void Recorder::findHarm() {
    if (mLoss) return;
    if (const auto harm = mParts.findHarm()) lose(*harm);
}

/** Writes what was gathered; false if it is lost. */
bool Recorder::write() {
    if (!mText.empty()) findHarm();
    return writeUnharmed();
}

/** The same where `findHarm` has just been called: it is a system call. */
bool Recorder::writeUnharmed() {
    if (!mLoss && !mText.empty()) {
        if (const auto error = mParts.write(mText)) {
            lose(*error);
        } else {
            mWrittenTo = mTimes.last();
        }
    }
    mText.clear();
    return !mLoss;
}

/** From now on lines are lost. The trace says so as well as it can, should it never go on. */
void Recorder::lose(const std::string& why) {
    mText.clear();
    const bool namesFile = why.compare(0, mParts.path().size(), mParts.path()) == 0;
    mLoss = Loss{mParts.isGone() ? mPartBegan : mWrittenTo,
                 "the record " + (namesFile ? why.substr(mParts.path().size() + 1) : why)};
    mOrder.clear();
    noteLoss(mTimes.last());
    mSaid += "lines are lost: " + why + ". ";
}

/** Goes on after a loss if that can be done. Tries at once, then from time to time. */
bool Recorder::goOn(int64_t real) {
    if (mLoss->hasTried && real - mLoss->tried < kRetryNs) return false;
    mLoss->hasTried = true;
    mLoss->tried = real;
    const int64_t at = mTimes.next(real);
    appendStart(at, "goes on after a loss", lostNote(mLoss->from, at, mLoss->why));
    const std::string text = std::exchange(mText, {});
    if (mParts.resume(text.size())) return false;
    const bool isFull = mParts.isFullFor(text.size() + kReserve);
    if ((isFull && mParts.startNext()) || mParts.write(text)) {
        noteLoss(at);
        return false;
    }
    mWrittenTo = mPartBegan = at;
    mLoss.reset();
    ++mGeneration;
    mSaid += "The record goes on. ";
    return true;
}

/** Writes a note that `goOn` takes back: it stays if the process ends before. */
void Recorder::noteLoss(int64_t to) {
    mParts.writeNote(lineOf(mWrittenTo, lostNote(mLoss->from, to, mLoss->why)));
}

}  // namespace record
