#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "record/Stint.h"

namespace android {
class MessageHandler;
}

namespace record {

/**
 * Gives calls and messages their times, so that a replay runs them in the order in which they ran
 * here.
 *  - The device's worker thread runs late; a replay's never does. So a call that is made while a
 *    message is overdue gets a time before that message.
 *  - A replay's call takes no time. So a call that is made while another one lasts gets its time.
 *  - A replay's Looper waits in whole milliseconds. So a call that is made right after a message
 * may get a time up to 1 ms ahead.
 *
 * No time is further back than `kPatienceNs`. Work that hangs in somebody else's code holds nobody
 * back for more than `kForeignPatienceNs`.
 *
 * A moment is a time at which the replay's worker runs messages, all of them that are due by then.
 * Nothing can come between two messages of one moment.
 *
 * Times are nanoseconds of the monotonic clock; `real` is the present one. Not safe for threads by
 * itself.
 */
class LineTimes {
public:
    /** The time of lines that are written at `real`, on account of a call. */
    int64_t next(int64_t real);

    /** The time of a line that tells what the library did at `now`. */
    int64_t tell(int64_t now);

    /** The time of the last line. */
    int64_t last() const { return mLast; }

    /** No line has a time before `time` any more. */
    void raise(int64_t time);

    // A call of the time that `next` has given begins, or ends. Until it ends no time passes: it
    // may yet post a message for its moment, and that comes after the calls of other threads. What
    // calls of the same time do to messages counts as done in the order in which they began. To end
    // a call that has not begun does nothing.
    void beginCall(Stint* call, int64_t real);
    void endCall(const Stint& call, int64_t real);

    /** Whether a call lasts that a message should wait for. */
    bool hasOpenCalls(int64_t real) const;

    /** Whether none does, and the last call has ended `ns` ago. */
    bool isQuiet(int64_t real, int64_t ns) const;

    /**
     * In the stint `poster`, the library posts `message`, which is `what` to `handler`. Returns
     * whether it is of the very moment that `poster` is in.
     */
    bool post(Stint* message, const android::MessageHandler* handler, int what, int delayMs,
              const Stint& poster);

    /**
     * In the stint `remover`, null for one that is not known, the library takes back every `what`
     * of `handler`, or whatever `handler` has. Returns the messages that this reaches: a call does
     * not reach those whose moment has begun.
     */
    std::vector<Stint*> remove(const android::MessageHandler* handler, std::optional<int> what,
                               const Stint* remover);

    enum class Turn {
        kNever,  // it has been taken back, though the worker had it in its hands already
        kLater,  // others come first, though they were posted when the worker had it in its hands
        kNow,
    };

    /** Whether it is the turn of `message`, which the worker is about to run. */
    Turn turnOf(const Stint& message) const;

    /** Whether the moment of `message` has begun with another message. */
    bool hasBegun(const Stint& message) const;

    /**
     * The worker runs `message`, whose turn it is, until `endMessage`. Returns the messages of the
     * moment that begins with it, in their order; none if it had begun.
     */
    std::vector<Stint*> start(Stint* message, int64_t real);
    void endMessage() { mRunning = nullptr; }

private:
    struct Pending {
        Stint* message;
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

    struct OpenCall {
        const Stint* stint;
        int64_t at;
        int64_t began;  // real
    };

    std::vector<Stint*> beginMoment(int64_t real);
    const Pending* find(const Stint& message) const;
    bool isTakenBack(const Pending& posted) const;
    std::optional<int64_t> nextMoment() const;

    std::vector<Pending> mPending;  // in the order of posting
    std::vector<Removal> mRemovals;
    std::vector<OpenCall> mOpenCalls;
    const Stint* mRunning = nullptr;  // the message that the worker runs
    int64_t mLastEnd = 0;             // of a call, in real time
    int64_t mLast = 0;                // of the last line
    int64_t mFloor = 0;               // of the next call at least
    int64_t mWait = 0;                // when the replay's worker began to wait
    int32_t mOrder = 0;               // of the last call among those of its time
};

}  // namespace record
