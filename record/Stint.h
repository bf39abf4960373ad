#pragma once

#include <atomic>
#include <cstdint>
#include <string>

namespace record {

/** The library's clock is never further behind the real one than this. */
inline constexpr int64_t kPatienceNs = 200'000'000;

/** Nobody waits for longer than this for a stint that has called somebody else's code. */
inline constexpr int64_t kForeignPatienceNs = 5'000'000;

/**
 * A stretch of the library's work on one thread: a call from outside, or a message that the worker
 * thread runs. All that the library calls meanwhile on that thread is its own business.
 *
 * While a stint lasts, the monotonic clock stands still for its thread, as it does in a replay:
 * what the library measures is then the same in both.
 */
class Stint {
public:
    /** Makes a stint, or none (null), the thread's present one while it is in scope. */
    class Scope {
    public:
        explicit Scope(Stint* stint) : mOuter(tCurrent) { tCurrent = stint; }
        ~Scope() { tCurrent = mOuter; }
        Scope(const Scope&) = delete;
        Scope& operator=(const Scope&) = delete;

    private:
        Stint* const mOuter;
    };

    Stint() = default;
    Stint(const Stint&) = delete;
    Stint& operator=(const Stint&) = delete;

    /** What runs on this thread; null outside the library, and in code that it has called. */
    static Stint* current() { return tCurrent; }

    /** The library, within this stint, calls something that the recorder sees. */
    virtual void onCall() {}

    /** The clock that the library sees at the real time `real`, in nanoseconds. */
    int64_t clock(int64_t real) {
        if (!clockStands) return real;
        if (real - now > kPatienceNs) now = real;
        return now;
    }

    /** Whether it has been in somebody else's code for longer than `ns` at the time `real`. */
    bool isOutside(int64_t real, int64_t ns) const {
        const int64_t since = outsideSince.load(std::memory_order_relaxed);
        return since != 0 && real - since > ns;
    }

    // Touched by its own thread only.
    int64_t now = 0;    // nanoseconds of the monotonic clock; valid once it has begun
    int32_t order = 0;  // what is posted comes in the order of its stints, also at the same time
    bool clockStands = false;
    bool isMessage = false;
    bool tellsMoment = false;  // a line that leads to its moment is still to be written

    // Written by its own thread.
    std::atomic<int64_t> outsideSince{0};  // when it called somebody else's code; 0: it did not

    // The recorder's, under its lock: see StintOrder and Recorder.
    Stint* older = nullptr;
    Stint* newer = nullptr;
    bool isOrdered = false;
    std::string held;   // what it has done
    std::string after;  // what newer ones have done that have ended
    int generation = 0;

protected:
    ~Stint() = default;

private:
    static thread_local Stint* tCurrent;
};

/** A stint that says nothing of its own accord. */
class PlainStint final : public Stint {};

}  // namespace record
