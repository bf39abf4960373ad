#include "record/Timeline.h"

#include <algorithm>

namespace record {

namespace {

/**
 * The time does not stand still for longer than this: a call may block in the device's telemetry,
 * a message's Looper may have ended.
 */
constexpr int64_t kPatienceNs = 10'000'000'000;

/** The order of what messages post, behind all calls of the same time. */
constexpr int32_t kLastOrder = 1000;

}  // namespace

int64_t Timeline::next(int64_t real) {
    int64_t at = real;
    const auto comeBefore = [&](int64_t latest) {
        if (real - latest < kPatienceNs) at = std::min(at, latest);
    };
    for (const int64_t call : mOpenCalls) comeBefore(call);
    for (const Pending& pending : mPending) {
        // What is due as it is posted runs after the lines of that very moment; other messages run
        // before those of the moment in which they are due.
        if (pending.isSeparate && !pending.isBegun) {
            comeBefore(std::max(pending.due - 1, pending.posted));
        }
    }
    at = std::max(at, mFloor);
    mOrder = at == mLast ? std::min(mOrder + 1, kLastOrder - 1) : 0;
    mFloor = mLast = at;
    return at;
}

int64_t Timeline::tell(int64_t now) {
    mLast = std::max(mLast, now);
    mFloor = std::max(mFloor, mLast);
    return mLast;
}

void Timeline::beginCall(Run* call) {
    call->now = mLast;
    call->order = mOrder;
    mOpenCalls.push_back(call->now);
}

void Timeline::endCall(const Run& call, int64_t real) {
    mLastEnd = real;
    const auto found = std::find(mOpenCalls.begin(), mOpenCalls.end(), call.now);
    if (found != mOpenCalls.end()) mOpenCalls.erase(found);
}

bool Timeline::isQuiet(int64_t real, int64_t ns) const {
    return mOpenCalls.empty() && real - mLastEnd >= ns;
}

void Timeline::post(Run* message, const android::MessageHandler* handler, int what, int delayMs,
                    const Run& poster) {
    const int64_t due = poster.now + int64_t{std::max(delayMs, 0)} * 1'000'000;
    const bool isSeparate = !poster.isMessage || due > poster.now;
    mPending.push_back({message, handler, what, poster.now, due, isSeparate, false});
}

std::vector<Run*> Timeline::remove(const android::MessageHandler* handler,
                                   std::optional<int> what) {
    std::vector<Run*> removed;
    for (auto it = mPending.begin(); it != mPending.end();) {
        if (it->handler == handler && (!what || it->what == *what) && !it->isBegun) {
            removed.push_back(it->message);
            it = mPending.erase(it);
        } else {
            ++it;
        }
    }
    return removed;
}

bool Timeline::hasBegun(const Run* message) const {
    return std::any_of(mPending.begin(), mPending.end(), [&](const Pending& pending) {
        return pending.message == message && pending.isBegun;
    });
}

bool Timeline::start(Run* message, std::vector<Run*>* begun) {
    const auto found = std::find_if(mPending.begin(), mPending.end(), [&](const Pending& pending) {
        return pending.message == message;
    });
    if (found == mPending.end()) return false;
    const int64_t now = found->due;
    // A call of the same moment would come before what was posted in it.
    bool lasts = found->due == found->posted;
    if (!found->isBegun) begun->push_back(message);
    found->isBegun = true;
    for (Pending& pending : mPending) {
        if (pending.due > now) continue;
        if (!pending.isBegun) begun->push_back(pending.message);
        lasts = lasts || pending.message != message;
        pending.isBegun = true;
    }
    message->now = now;
    message->order = kLastOrder;
    message->isMessage = true;
    mFloor = std::max(mFloor, lasts ? now + 1 : now);
    mPending.erase(found);
    return true;
}

}  // namespace record
