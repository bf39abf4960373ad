#include "capture/JoinedStates.h"

#include <algorithm>
#include <optional>
#include <tuple>
#include <utility>

#include "capture/dump/WallTime.h"

namespace capture {

namespace {

void addChangesFrom(int64_t start, const std::vector<StateValue>& values,
                    std::vector<StateValue>* changes) {
    std::optional<int> told;
    for (auto value = values.begin(); value != values.end(); ++value) {
        const int64_t at = std::max(cutToSecond(value->at), start);
        const auto next = std::next(value);
        const bool isLast = next == values.end() || std::max(cutToSecond(next->at), start) > at;
        if (!isLast || told == value->value) continue;
        told = value->value;
        changes->push_back({at, value->state, value->value});
    }
}

}  // namespace

void JoinedStates::add(const StateCourse& course, int64_t end) {
    if (mHasEnd && end <= mEnd) return;
    for (const State state : kStates) add(state, course, end);
    mHasEnd = true;
    mEnd = end;
}

StateCourse JoinedStates::finish() {
    for (const State state : kStates) goIdle(state);
    return std::move(mCourse);
}

void JoinedStates::add(State state, const StateCourse& course, int64_t end) {
    std::optional<int64_t> from;
    const auto take = [&](int64_t at, int value) {
        if (!from) from = at;
        mCourse.add({at, state, value});
    };
    const auto before = mHasEnd ? course.at(state, mEnd) : std::nullopt;
    if (before) take(mEnd, *before);
    if (mHasEnd && !before) goIdle(state);
    for (const StateValue& value : course.of(state)) {
        const int64_t at = cutToSecond(value.at);
        if ((!mHasEnd || at > mEnd) && at <= end) take(at, value.value);
    }
    if (!from) return;
    auto& known = intervals(state);
    if (!known.empty() && known.back().to == *from) {
        known.back().to = end;
    } else {
        known.push_back({*from, end});
    }
}

void JoinedStates::goIdle(State state) {
    const auto& past = known(state);
    if (past.empty() || past.back().to != mEnd) return;
    mCourse.add({mEnd, state, idleValue(state)});
}

std::vector<StateValue> changesFrom(int64_t start, const StateCourse& course) {
    std::vector<StateValue> changes;
    for (const State state : kStates) addChangesFrom(start, course.of(state), &changes);
    std::stable_sort(changes.begin(), changes.end(), [](const StateValue& a, const StateValue& b) {
        return std::tuple(a.at, a.state) < std::tuple(b.at, b.state);
    });
    return changes;
}

}  // namespace capture
