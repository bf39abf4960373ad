#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/StrongPointer.h>

#include "record/Courier.h"
#include "record/Names.h"
#include "record/Parts.h"
#include "record/Run.h"
#include "record/RunOrder.h"
#include "record/Screen.h"
#include "record/Settings.h"
#include "record/Surroundings.h"
#include "record/Timeline.h"

namespace record {

/**
 * Writes a process's trace. The first call decides, by the settings (docs/recording.md), whether
 * there is one; it begins with a boot line and with the properties and variables that the library
 * reads.
 *
 * All operations may be called from any thread. One lock guards all; it is never held while the
 * library, the host or the device's telemetry runs. What cannot be written ends the record, with
 * one line in the log, and nothing else.
 */
class Recorder {
public:
    /** The process's recorder; null if nothing is recorded, or not any more. */
    static Recorder* get();

    /**
     * The recorder as long as the process lives, also after the record has ended: messages that
     * were posted through it are still on their way. Null if there never was one.
     */
    static Recorder* getOnceStarted();

    /** Whether events matter: a client holds the proximity sensor. */
    static bool wantsEvents() { return sWantsEvents.load(std::memory_order_relaxed); }

    /** What replaces the names of packages; null if they are to be written as they are. */
    Names* names() const { return mNames.get(); }

    /** A call from outside, as its line tells it. */
    struct Call {
        std::string body;
        bool readsProperties = false;  // the library reads properties on account of it
        bool isSample = false;         // of the screen
        const int* rgb = nullptr;      // a sample's averages; null: it has failed
        const int* rect = nullptr;     // a sample's rectangle
    };

    /** `run`, a call from outside, begins: its lines are written. */
    void beginCall(Run* run, const Call& call) EXCLUDES(mLock);

    /** `run` ends. */
    void end(Run* run) EXCLUDES(mLock);

    // The library is about to send telemetry, or to set a property, in `run`.
    void expectEvent(Run* run, const char* module, const char* id, const char* payload)
            EXCLUDES(mLock);
    void expectProperty(Run* run, const char* name, const char* value) EXCLUDES(mLock);

    /**
     * The library posts `what` to `handler` on `thread`, in `run`. Returns the handler to post it
     * to instead.
     */
    android::sp<Courier> post(const Run& run, android::SensorHandlerThread* thread,
                              const Courier::Handler& handler, int what, int delayMs)
            EXCLUDES(mLock);

    /**
     * The library takes back every `what` of `handler`, or whatever `handler` has, in `run`, which
     * is null if it is not known. Returns the handlers that these messages were posted to.
     */
    std::vector<android::sp<Courier>> remove(const Run* run, const Courier::Handler& handler,
                                             std::optional<int> what) EXCLUDES(mLock);

    /** The worker thread comes to a message. It runs if it is its turn, or if it cannot yield. */
    Timeline::Turn beginMessage(Run* message, bool canYield) EXCLUDES(mLock);

    /** The singleton that the call `name` creates is there. */
    void noteSingleton(const char* name) EXCLUDES(mLock);

    /** The client `client` has enabled, or disabled, the proximity sensor. */
    void noteProximity(bool enabled, const std::string& client) EXCLUDES(mLock);

private:
    Recorder() = default;

    static void start();
    static void leaveToParent() NO_THREAD_SAFETY_ANALYSIS;

    void waitForQuiet(const Run& message) REQUIRES(mLock);
    Parts::Error begin(const Settings& settings) EXCLUDES(mLock);
    void expect(Run* run, std::string_view body) EXCLUDES(mLock);

    // Lines are gathered and then written at once.
    void append(int64_t at, std::string_view body) REQUIRES(mLock);
    void appendAny(int64_t at, std::string_view body) REQUIRES(mLock);
    void appendAll(std::string_view bodies, int64_t now) REQUIRES(mLock);
    void appendStart(int64_t at) REQUIRES(mLock);
    void startPart(int64_t at) REQUIRES(mLock);
    void endRun(Run* run) REQUIRES(mLock);
    void write() REQUIRES(mLock);
    void stop(const std::string& error) REQUIRES(mLock);

    static std::atomic<Recorder*> sWriting;  // null again when the record has ended
    static std::atomic<Recorder*> sStarted;
    static std::atomic<bool> sWantsEvents;

    std::unique_ptr<Names> mNames;  // constant once the record has begun

    android::Mutex mLock;
    Parts mParts GUARDED_BY(mLock);
    Timeline mTimeline GUARDED_BY(mLock);
    RunOrder mRuns GUARDED_BY(mLock);
    Surroundings mSurroundings GUARDED_BY(mLock);
    Screen mScreen GUARDED_BY(mLock);
    std::string mText GUARDED_BY(mLock);  // to be written
    std::vector<const char*> mSingletons GUARDED_BY(mLock);
    std::set<std::string> mProximityClients GUARDED_BY(mLock);
};

}  // namespace record
