#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace android {
class MessageHandler;
}

namespace record {

/**
 * Gives lines their times so that a replay runs calls and messages in the order in which they ran
 * here. A replay runs each message in the very moment in which it is due; the device's worker
 * thread is always a little late. A call that comes while a message is late is therefore dated
 * back to before the moment in which that was due.
 *
 * Times are nanoseconds of the monotonic clock. Not safe for threads by itself.
 */
class Timeline {
public:
    /** The time of a call that comes at `real`. */
    int64_t next(int64_t real);

    /** The time of a line that tells what the library did at `now`. */
    int64_t tell(int64_t now);

    /** The library posts `what` at `now`; `byMessage`: while it runs a message. */
    void post(const android::MessageHandler* handler, int what, int64_t now, int delayMs,
              bool byMessage);

    /** The library takes back every pending `what` of `handler`, or whatever `handler` has. */
    void remove(const android::MessageHandler* handler, std::optional<int> what);

    /** The worker begins a message. Returns its moment; nothing if the message was taken back. */
    std::optional<int64_t> start(const android::MessageHandler* handler, int what);

private:
    struct Message {
        const android::MessageHandler* handler;
        int what;
        int64_t posted;
        int64_t due;
        bool holds;  // calls must be dated before it
    };

    std::vector<Message> mPending;
    int64_t mLast = 0;   // of the last line
    int64_t mFloor = 0;  // of the next call at least
};

}  // namespace record
