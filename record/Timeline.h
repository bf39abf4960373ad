#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "record/Run.h"

namespace android {
class MessageHandler;
}

namespace record {

/**
 * Gives calls and messages their times, so that a replay runs them in the order in which they ran
 * here. A replay's worker thread is never late, this one always is a little: a call that comes
 * while a message is late, or while another call lasts, is dated back. It also follows how the
 * replay's Looper waits, in whole milliseconds: what comes after a message may be dated up to 1 ms
 * ahead.
 *
 * A moment is a time at which the replay's worker runs messages, all of them that are due by then.
 * Nothing can come between two messages of one moment.
 *
 * Times are nanoseconds of the monotonic clock. Not safe for threads by itself.
 */
class Timeline {
public:
    /** The time of lines that are written at `real`, on account of a call. */
    int64_t next(int64_t real);

    /** The time of a line that tells what the library did at `now`. */
    int64_t tell(int64_t now);

    // A call of the time that `next` has given begins, or ends. Until it ends no time passes: it
    // may yet post a message for its moment, and that comes after the calls of other threads. What
    // calls of the same time do to messages counts as done in the order in which they began.
    void beginCall(Run* call);
    void endCall(const Run& call, int64_t real);

    /** Whether no call lasts, and the last one has ended `ns` before `real`. */
    bool isQuiet(int64_t real, int64_t ns) const;
    bool hasOpenCalls() const { return !mOpenCalls.empty(); }

    /**
     * In the run `poster`, the library posts `message`, which is `what` to `handler`. Returns
     * whether it is of the very moment that `poster` is in.
     */
    bool post(Run* message, const android::MessageHandler* handler, int what, int delayMs,
              const Run& poster);

    /**
     * In the run `remover`, null for one that is not known, the library takes back every `what` of
     * `handler`, or whatever `handler` has. Returns the messages that this reaches: a call does not
     * reach those whose moment has begun.
     */
    std::vector<Run*> remove(const android::MessageHandler* handler, std::optional<int> what,
                             const Run* remover);

    enum class Turn {
        kNever,  // it has been taken back, though the worker had it in its hands already
        kLater,  // others come first, though they were posted when the worker had it in its hands
        kNow,
    };

    /** Whether it is the turn of `message`, which the worker is about to run. */
    Turn turnOf(const Run& message) const;

    /** Whether the moment of `message` has begun with another message. */
    bool hasBegun(const Run& message) const;

    /**
     * The worker runs `message`, whose turn it is. Returns the messages of the moment that begins
     * with it, in their order; none if it had begun.
     */
    std::vector<Run*> start(Run* message);

private:
    struct Pending {
        Run* message;
        const android::MessageHandler* handler;
        int what;
        int64_t posted;
        int32_t order;  // of its poster among those of the same time
        int64_t due;
        bool hasBegun;

        /** In `mPending` both. */
        bool comesBefore(const Pending& other) const {
            if (due != other.due) return due < other.due;
            return order != other.order ? order < other.order : this < &other;
        }
    };

    /** What a call has taken back at the time `mLast`. */
    struct Removal {
        const android::MessageHandler* handler;
        std::optional<int> what;
        int32_t order;  // of the call
    };

    std::vector<Run*> beginMoment();
    const Pending* find(const Run& message) const;
    bool isTakenBack(const Pending& posted) const;
    std::optional<int64_t> nextMoment() const;

    std::vector<Pending> mPending;  // in the order of posting
    std::vector<Removal> mRemovals;
    std::vector<int64_t> mOpenCalls;  // their times
    int64_t mLastEnd = 0;             // of a call, in real time
    int64_t mLast = 0;                // of the last line
    int64_t mFloor = 0;               // of the next call at least
    int64_t mWait = 0;                // when the replay's worker began to wait
    int32_t mOrder = 0;               // of the last call among those of its time
};

}  // namespace record
