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
 * here. A replay runs a message in the very moment in which it is due, and all messages of a moment
 * at once; the device's worker thread is always a little late. A call that comes while a message is
 * late, or while another call lasts, is therefore dated back.
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
    // may yet post a message for its moment, and that comes after the calls of other threads.
    void beginCall(Run* call);
    void endCall(const Run& call, int64_t real);

    /** Whether no call lasts, and the last one has ended `ns` before `real`. */
    bool isQuiet(int64_t real, int64_t ns) const;

    /** In the run `poster`, the library posts `message`, which is `what` to `handler`. */
    void post(Run* message, const android::MessageHandler* handler, int what, int delayMs,
              const Run& poster);

    /**
     * The library takes back every `what` of `handler`, or whatever `handler` has. Returns the
     * messages that this reaches; it does not reach those that the worker has come to.
     */
    std::vector<Run*> remove(const android::MessageHandler* handler, std::optional<int> what);

    /**
     * Whether the worker has come to the moment of `message` with another message. The two cannot
     * be told apart in time.
     */
    bool hasBegun(const Run* message) const;

    /**
     * The worker runs `message`. False if it has been taken back: the worker had it in its hands
     * already, but no earlier than the call that took it back. Otherwise the worker has come to all
     * messages of that moment; `begun` gets those that it comes to now, in their order.
     */
    bool start(Run* message, std::vector<Run*>* begun);

private:
    struct Pending {
        Run* message;
        const android::MessageHandler* handler;
        int what;
        int64_t posted;
        int64_t due;
        bool isSeparate;  // calls can come between it and what has posted it
        bool isBegun;     // the worker has come to its moment
    };

    std::vector<Pending> mPending;    // in the order of posting
    std::vector<int64_t> mOpenCalls;  // their times
    int64_t mLastEnd = 0;             // of a call, in real time
    int64_t mLast = 0;                // of the last line
    int64_t mFloor = 0;               // of the next call at least
    int32_t mOrder = 0;               // of the last call among those of its time
};

}  // namespace record
