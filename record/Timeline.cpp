#include "record/Timeline.h"

#include <algorithm>

namespace record {

namespace {

/** A message that is later than this is not waited for: its Looper may have ended. */
constexpr int64_t kPatienceNs = 10'000'000'000;

}  // namespace

int64_t Timeline::next(int64_t real) {
    int64_t at = real;
    for (const Message& message : mPending) {
        // What is due as it is posted runs after the lines of that very moment, other messages run
        // before those of the moment in which they are due.
        const int64_t latest = std::max(message.due - 1, message.posted);
        if (message.holds && real - latest < kPatienceNs) at = std::min(at, latest);
    }
    mFloor = mLast = std::max(at, mFloor);
    return mLast;
}

int64_t Timeline::tell(int64_t now) {
    mLast = std::max(mLast, now);
    mFloor = std::max(mFloor, mLast);
    return mLast;
}

void Timeline::post(const android::MessageHandler* handler, int what, int64_t now, int delayMs,
                    bool byMessage) {
    const int64_t due = now + int64_t{std::max(delayMs, 0)} * 1'000'000;
    // Nothing can come between a message and what it posts for its own moment.
    mPending.push_back({handler, what, now, due, !byMessage || due > now});
}

void Timeline::remove(const android::MessageHandler* handler, std::optional<int> what) {
    mPending.erase(std::remove_if(mPending.begin(), mPending.end(),
                                  [&](const Message& message) {
                                      return message.handler == handler &&
                                             (!what || message.what == *what);
                                  }),
                   mPending.end());
}

std::optional<int64_t> Timeline::start(const android::MessageHandler* handler, int what) {
    auto found = mPending.end();
    for (auto it = mPending.begin(); it != mPending.end(); ++it) {
        if (it->handler != handler || it->what != what) continue;
        if (found == mPending.end() || it->due < found->due) found = it;
    }
    if (found == mPending.end()) return std::nullopt;
    const int64_t now = found->due;
    bool lasts = found->due == found->posted;  // its moment has lines that come before it
    mPending.erase(found);
    for (Message& message : mPending) {
        if (message.due > now) continue;
        message.holds = false;  // of the same moment: nothing can come between them
        lasts = true;
    }
    mFloor = std::max(mFloor, lasts ? now + 1 : now);
    return now;
}

}  // namespace record
