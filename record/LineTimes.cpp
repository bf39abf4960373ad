#include "record/LineTimes.h"

#include <algorithm>

#include "base/Calendar.h"

namespace record {

namespace {

using base::kNsPerMs;

/** A message does not wait for a call that has lasted for longer than this. */
constexpr int64_t kLongCallNs = 60'000'000;

/** The order of what messages post, behind all calls of the same time. */
constexpr int32_t kLastOrder = 1000;

}  // namespace

int64_t LineTimes::next(int64_t real) {
    int64_t at = real;
    const auto comeBy = [&](int64_t latest) {
        if (real - latest < kPatienceNs) at = std::min(at, latest);
    };
    for (const OpenCall& call : mOpenCalls) {
        if (!call.stint->isOutside(real, kForeignPatienceNs)) comeBy(call.at);
    }
    // A call comes before the messages that calls of the same time have posted for that time, but
    // after those that have become due.
    const bool workerHangs = mRunning != nullptr && mRunning->isOutside(real, kForeignPatienceNs);
    if (const auto moment = nextMoment(); moment && !workerHangs) {
        comeBy(std::max(*moment - 1, mWait));
    }
    at = std::max(at, mFloor);
    if (at > mLast) mRemovals.clear();
    mOrder = at == mLast ? std::min(mOrder + 1, kLastOrder - 1) : 0;
    mFloor = mLast = at;
    return at;
}

int64_t LineTimes::tell(int64_t now) {
    raise(std::max(mLast, now));
    return mLast;
}

void LineTimes::raise(int64_t time) {
    mLast = std::max(mLast, time);
    mFloor = std::max(mFloor, mLast);
}

void LineTimes::beginCall(Stint* call, int64_t real) {
    call->now = mLast;
    call->order = mOrder;
    mOpenCalls.push_back({call, call->now, real});
}

void LineTimes::endCall(const Stint& call, int64_t real) {
    const auto found = std::find_if(mOpenCalls.begin(), mOpenCalls.end(),
                                    [&](const OpenCall& open) { return open.stint == &call; });
    if (found == mOpenCalls.end()) return;
    mOpenCalls.erase(found);
    mLastEnd = real;
}

bool LineTimes::hasOpenCalls(int64_t real) const {
    return std::any_of(mOpenCalls.begin(), mOpenCalls.end(), [real](const OpenCall& call) {
        return real - call.began < kLongCallNs && !call.stint->isOutside(real, 0);
    });
}

bool LineTimes::isQuiet(int64_t real, int64_t ns) const {
    return !hasOpenCalls(real) && real - mLastEnd >= ns;
}

bool LineTimes::post(Stint* message, const android::MessageHandler* handler, int what, int delayMs,
                     const Stint& poster) {
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
bool LineTimes::isTakenBack(const Pending& posted) const {
    return posted.posted == mLast &&
           std::any_of(mRemovals.begin(), mRemovals.end(), [&](const Removal& removal) {
               return removal.order > posted.order && removal.handler == posted.handler &&
                      (!removal.what || *removal.what == posted.what);
           });
}

std::vector<Stint*> LineTimes::remove(const android::MessageHandler* handler,
                                      std::optional<int> what, const Stint* remover) {
    if (remover != nullptr) mWait = std::max(mWait, remover->now);
    const bool isCall = remover != nullptr && !remover->isMessage;
    if (isCall) mRemovals.push_back({handler, what, remover->order});
    const auto isOutOfReach = [&](const Pending& pending) {
        const bool comesLater =
                isCall && pending.posted == remover->now && pending.order > remover->order;
        return isCall && (pending.hasBegun || comesLater);
    };
    std::vector<Stint*> removed;
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

LineTimes::Turn LineTimes::turnOf(const Stint& message) const {
    const Pending* pending = find(message);
    if (pending == nullptr) return Turn::kNever;
    const bool isFirst =
            std::none_of(mPending.begin(), mPending.end(),
                         [pending](const Pending& other) { return other.comesBefore(*pending); });
    return isFirst ? Turn::kNow : Turn::kLater;
}

bool LineTimes::hasBegun(const Stint& message) const {
    const Pending* pending = find(message);
    return pending != nullptr && pending->hasBegun;
}

std::vector<Stint*> LineTimes::start(Stint* message, int64_t real) {
    std::vector<Stint*> begun;
    if (!hasBegun(*message)) begun = beginMoment(real);
    mRunning = message;
    message->order = kLastOrder;
    message->isMessage = true;
    mPending.erase(mPending.begin() + (find(*message) - mPending.data()));
    return begun;
}

std::vector<Stint*> LineTimes::beginMoment(int64_t real) {
    int64_t moment = nextMoment().value_or(mWait);
    // The worker was too late for a replay to follow. Rather than the replay's clock, the library
    // sees one that neither goes back nor is wrong.
    if (moment < mLast || real - moment > kPatienceNs) moment = std::max({moment, mLast, real});
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
    std::vector<Stint*> begun;
    begun.reserve(reached.size());
    for (const Pending* pending : reached) begun.push_back(pending->message);
    return begun;
}

const LineTimes::Pending* LineTimes::find(const Stint& message) const {
    const auto found = std::find_if(mPending.begin(), mPending.end(), [&](const Pending& pending) {
        return pending.message == &message;
    });
    return found != mPending.end() ? &*found : nullptr;
}

/** When the replay's worker runs the next message whose moment has not begun. */
std::optional<int64_t> LineTimes::nextMoment() const {
    std::optional<int64_t> due;
    for (const Pending& pending : mPending) {
        if (!pending.hasBegun && (!due || pending.due < *due)) due = pending.due;
    }
    if (!due || *due <= mWait) return due ? std::optional(mWait) : due;
    return mWait + (*due - mWait + kNsPerMs - 1) / kNsPerMs * kNsPerMs;
}

}  // namespace record
