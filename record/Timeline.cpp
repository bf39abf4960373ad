#include "record/Timeline.h"

#include <algorithm>

namespace record {

namespace {

constexpr int64_t kNsPerMs = 1'000'000;

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
    const auto comeBy = [&](int64_t latest) {
        if (real - latest < kPatienceNs) at = std::min(at, latest);
    };
    for (const int64_t call : mOpenCalls) comeBy(call);
    // A call comes before the messages that calls of the same time have posted for that time, but
    // after those that have become due.
    if (const auto moment = nextMoment()) comeBy(std::max(*moment - 1, mWait));
    at = std::max(at, mFloor);
    if (at > mLast) mRemovals.clear();
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

bool Timeline::post(Run* message, const android::MessageHandler* handler, int what, int delayMs,
                    const Run& poster) {
    const int64_t due = poster.now + std::max(delayMs, 0) * kNsPerMs;
    mWait = std::max(mWait, poster.now);
    const bool hasBegun = poster.isMessage && due <= mWait;
    const Pending posted{message, handler, what, poster.now, poster.order, due, hasBegun};
    if (!poster.isMessage && isTakenBack(posted)) return false;
    mPending.push_back(posted);
    if (hasBegun) message->now = mWait;
    return hasBegun;
}

/** Whether a call that began later, but was faster, has already taken the message back. */
bool Timeline::isTakenBack(const Pending& posted) const {
    return posted.posted == mLast &&
           std::any_of(mRemovals.begin(), mRemovals.end(), [&](const Removal& removal) {
               return removal.order > posted.order && removal.handler == posted.handler &&
                      (!removal.what || *removal.what == posted.what);
           });
}

std::vector<Run*> Timeline::remove(const android::MessageHandler* handler, std::optional<int> what,
                                   const Run* remover) {
    if (remover != nullptr) mWait = std::max(mWait, remover->now);
    const bool isCall = remover != nullptr && !remover->isMessage;
    if (isCall) mRemovals.push_back({handler, what, remover->order});
    const auto isOutOfReach = [&](const Pending& pending) {
        const bool comesLater =
                isCall && pending.posted == remover->now && pending.order > remover->order;
        return isCall && (pending.hasBegun || comesLater);
    };
    std::vector<Run*> removed;
    for (auto it = mPending.begin(); it != mPending.end();) {
        const bool matches = it->handler == handler && (!what || it->what == *what);
        if (matches && !isOutOfReach(*it)) {
            removed.push_back(it->message);
            it = mPending.erase(it);
        } else {
            ++it;
        }
    }
    return removed;
}

Timeline::Turn Timeline::turnOf(const Run& message) const {
    const Pending* pending = find(message);
    if (pending == nullptr) return Turn::kNever;
    const bool isFirst =
            std::none_of(mPending.begin(), mPending.end(),
                         [pending](const Pending& other) { return other.comesBefore(*pending); });
    return isFirst ? Turn::kNow : Turn::kLater;
}

bool Timeline::hasBegun(const Run& message) const {
    const Pending* pending = find(message);
    return pending != nullptr && pending->hasBegun;
}

std::vector<Run*> Timeline::start(Run* message) {
    std::vector<Run*> begun;
    if (!hasBegun(*message)) begun = beginMoment();
    message->order = kLastOrder;
    message->isMessage = true;
    mPending.erase(mPending.begin() + (find(*message) - mPending.data()));
    return begun;
}

std::vector<Run*> Timeline::beginMoment() {
    const int64_t moment = nextMoment().value_or(mWait);
    std::vector<const Pending*> reached;
    for (Pending& pending : mPending) {
        if (pending.hasBegun || pending.due > moment) continue;
        pending.hasBegun = true;
        pending.message->now = moment;
        reached.push_back(&pending);
    }
    std::sort(reached.begin(), reached.end(),
              [](const Pending* a, const Pending* b) { return a->comesBefore(*b); });
    // A call at the moment itself would come before what was posted at it, or before the rest.
    const bool isOver = moment == mWait || reached.size() > 1;
    mFloor = std::max(mFloor, isOver ? moment + 1 : moment);
    mWait = moment;
    std::vector<Run*> begun;
    begun.reserve(reached.size());
    for (const Pending* pending : reached) begun.push_back(pending->message);
    return begun;
}

const Timeline::Pending* Timeline::find(const Run& message) const {
    const auto found = std::find_if(mPending.begin(), mPending.end(), [&](const Pending& pending) {
        return pending.message == &message;
    });
    return found != mPending.end() ? &*found : nullptr;
}

/** When the replay's worker runs the next message whose moment has not begun. */
std::optional<int64_t> Timeline::nextMoment() const {
    std::optional<int64_t> due;
    for (const Pending& pending : mPending) {
        if (!pending.hasBegun && (!due || pending.due < *due)) due = pending.due;
    }
    if (!due || *due <= mWait) return due ? std::optional(mWait) : due;
    return mWait + (*due - mWait + kNsPerMs - 1) / kNsPerMs * kNsPerMs;
}

}  // namespace record
