#pragma once

#include <cstdint>
#include <string>

namespace record {

/**
 * A stretch of the library's work on one thread: a call from outside, or a message that the worker
 * thread runs. All that the library calls meanwhile on that thread is its own business.
 *
 * While it lasts, the monotonic clock stands still for that thread, as it does in a replay: what
 * the library measures is then the same in both.
 */
class Run {
public:
    /** Enters the run; leaves it when it goes out of scope. */
    class Scope {
    public:
        explicit Scope(Run* run) : mOuter(tCurrent) { tCurrent = run; }
        ~Scope() { tCurrent = mOuter; }
        Scope(const Scope&) = delete;
        Scope& operator=(const Scope&) = delete;

    private:
        Run* const mOuter;
    };

    /** Lets the clock go on while somebody else's code runs within the library's. */
    class Outside {
    public:
        Outside() : mRun(tCurrent), mStands(mRun != nullptr && mRun->clockStands) {
            if (mRun != nullptr) mRun->clockStands = false;
        }
        ~Outside() {
            if (mRun != nullptr) mRun->clockStands = mStands;
        }
        Outside(const Outside&) = delete;
        Outside& operator=(const Outside&) = delete;

    private:
        Run* const mRun;
        const bool mStands;
    };

    Run() = default;
    Run(const Run&) = delete;
    Run& operator=(const Run&) = delete;

    /** What runs on this thread; null outside the library. */
    static Run* current() { return tCurrent; }

    /** The library, within this run, calls something that the recorder sees. */
    virtual void onCall() {}

    // Touched by its own thread only.
    int64_t now = 0;    // nanoseconds of the monotonic clock; valid once it has begun
    int32_t order = 0;  // what is posted comes in the order of its runs, also at the same time
    bool clockStands = false;
    bool isMessage = false;
    bool tellsMoment = false;  // a line that leads to its moment is still to be written

    // The recorder's, under its lock: see RunOrder.
    Run* older = nullptr;
    Run* newer = nullptr;
    bool isOrdered = false;
    std::string held;   // what it has done
    std::string after;  // what newer ones have done that have ended

protected:
    ~Run() = default;

private:
    static thread_local Run* tCurrent;
};

/** A run that says nothing of its own accord. */
class PlainRun final : public Run {};

}  // namespace record
