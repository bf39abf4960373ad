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
#include "record/LineTimes.h"
#include "record/Parts.h"
#include "record/Pseudonyms.h"
#include "record/Screen.h"
#include "record/Settings.h"
#include "record/Stint.h"
#include "record/StintOrder.h"
#include "record/Surroundings.h"

namespace record {

/**
 * Writes a process's trace. The first call decides, by the settings (docs/recording.md), whether
 * there is one; it begins with a boot line and with the properties and variables that the library
 * reads.
 *
 * What cannot be written is lost, and the trace says so. As soon as it can go on, it starts as a
 * process does. A forked child is not recorded, which the trace says as well, once the child calls
 * the library.
 *
 * All operations may be called from any thread. One lock guards all; it is never held while the
 * library, the host, the device's telemetry or its log runs.
 */
class Recorder {
public:
    /** The process's recorder; null if nothing is recorded. */
    static Recorder* get();

    /** The same for a call from outside: notes that a forked child has made one. */
    static Recorder* getForCall();

    /**
     * The recorder as long as the process lives, also in a forked child: messages that were posted
     * through it are still on their way. Null if there never was one.
     */
    static Recorder* getOnceStarted();

    /** Whether events matter: a client holds the proximity sensor. */
    static bool wantsEvents() { return sWantsEvents.load(std::memory_order_relaxed); }

    /** What replaces the names of packages; null if they are to be written as they are. */
    Pseudonyms* pseudonyms() const { return mPseudonyms.get(); }

    /** Which properties the library reads in a call, or soon after it on account of it. */
    enum class Reads { kNothing, kTestMode, kAll };

    /** A call from outside, as its line tells it. */
    struct CallLine {
        std::string body;
        Reads reads = Reads::kNothing;
        bool isSample = false;      // of the screen
        const int* rgb = nullptr;   // a sample's averages; null: it has failed
        const int* rect = nullptr;  // a sample's rectangle
    };

    /** `stint`, a call from outside, begins: its lines are written. */
    void beginCall(Stint* stint, const CallLine& call) EXCLUDES(mLock);

    /** `stint` ends. */
    void end(Stint* stint) EXCLUDES(mLock);

    /** The library is about to send telemetry in `stint`. */
    void expectEvent(Stint* stint, const char* module, const char* id, const char* payload)
            EXCLUDES(mLock);

    // The library is about to set a property in `stint`, or has tried to.
    void expectProperty(Stint* stint, const char* name, const char* value) EXCLUDES(mLock);
    void endProperty(const char* name) EXCLUDES(mLock);

    /**
     * The library posts `what` to `handler` on `thread`, in `stint`. Returns the handler to post it
     * to instead.
     */
    android::sp<Courier> post(const Stint& stint, android::SensorHandlerThread* thread,
                              const Courier::Handler& handler, int what, int delayMs)
            EXCLUDES(mLock);

    /**
     * The library takes back every `what` of `handler`, or whatever `handler` has, in `stint`,
     * which is null if it is not known. Returns the handlers that these messages were posted to.
     */
    std::vector<android::sp<Courier>> remove(const Stint* stint, const Courier::Handler& handler,
                                             std::optional<int> what) EXCLUDES(mLock);

    /** The worker thread comes to a message. It runs if it is its turn, or if it cannot yield. */
    LineTimes::Turn beginMessage(Stint* message, bool canYield) EXCLUDES(mLock);

    /** The message that runs has come to its end. */
    void endMessage(Stint* message) EXCLUDES(mLock);

    /** The singleton that the call `name` creates is there. */
    void noteSingleton(const char* name) EXCLUDES(mLock);

    /** The client `client` has enabled, or disabled, the proximity sensor. */
    void noteProximity(bool enabled, const std::string& client) EXCLUDES(mLock);

private:
    class Section;
    struct Shared;
    struct Loss {
        int64_t from = 0;  // ns of the trace's clock
        std::string why;
        bool hasTried = false;  // to go on
        int64_t tried = 0;      // when, in real time
    };

    Recorder() = default;

    static void settle();
    static std::string start();
    static void beforeFork() NO_THREAD_SAFETY_ANALYSIS;
    static void afterFork() NO_THREAD_SAFETY_ANALYSIS;
    static void beginChild() NO_THREAD_SAFETY_ANALYSIS;
    void noteChild() EXCLUDES(mLock);

    Error begin(const Settings& settings) EXCLUDES(mLock);
    void lock() ACQUIRE(mLock);
    void unlock() RELEASE(mLock);
    void waitForQuiet(const Stint& message) REQUIRES(mLock);
    bool isReady(int64_t real) REQUIRES(mLock);
    void expect(Stint* stint, std::string_view body) REQUIRES(mLock);
    void endStint(Stint* stint) REQUIRES(mLock);
    void leaveHanging(int64_t real) REQUIRES(mLock);

    // Lines are gathered and then written at once.
    void append(int64_t at, std::string_view body) REQUIRES(mLock);
    void appendAny(int64_t at, std::string_view body) REQUIRES(mLock);
    void appendAll(std::string_view bodies, int64_t now) REQUIRES(mLock);
    void appendStart(int64_t at, const char* how, const std::string& note) REQUIRES(mLock);
    void startPart(int64_t at) REQUIRES(mLock);
    bool write() REQUIRES(mLock);
    bool writeUnharmed() REQUIRES(mLock);

    void findHarm() REQUIRES(mLock);
    void lose(const std::string& why) REQUIRES(mLock);
    bool goOn(int64_t real) REQUIRES(mLock);
    void noteLoss(int64_t to) REQUIRES(mLock);

    static std::atomic<Recorder*> sWriting;  // null in a forked child
    static std::atomic<Recorder*> sStarted;
    static std::atomic<bool> sWantsEvents;
    static const int sForkWatch;  // set up while the recorder is loaded
    static Shared* sParents;      // of a forked child

    // Constant once the record has begun.
    std::unique_ptr<Pseudonyms> mPseudonyms;
    Shared* mShared = nullptr;  // with forked children; null in them, or if there is no memory

    android::Mutex mLock;
    Parts mParts GUARDED_BY(mLock);
    LineTimes mTimes GUARDED_BY(mLock);
    StintOrder mOrder GUARDED_BY(mLock);
    Surroundings mSurroundings GUARDED_BY(mLock);
    Screen mScreen GUARDED_BY(mLock);
    std::string mText GUARDED_BY(mLock);  // to be written
    std::string mSaid GUARDED_BY(mLock);  // to be logged when the lock is free
    std::vector<const char*> mSingletons GUARDED_BY(mLock);
    std::set<std::string> mProximityClients GUARDED_BY(mLock);
    std::optional<Loss> mLoss GUARDED_BY(mLock);  // while lines are being lost
    int64_t mWrittenTo GUARDED_BY(mLock) = 0;     // the time of the last line that was written
    int64_t mPartBegan GUARDED_BY(mLock) = 0;     // the time of this process's first line in it
    int mGeneration GUARDED_BY(mLock) = 0;        // how often the record has gone on after a loss
};

}  // namespace record
