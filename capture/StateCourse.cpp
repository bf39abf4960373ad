#include "capture/StateCourse.h"

#include <algorithm>
#include <utility>

#include "capture/dump/WallTime.h"

namespace capture {

namespace {

using Kind = HistoryStep::Kind;

/** Both sources' steps, taken in the order of their times. */
class SourceMerge {
public:
    StateCourse course;

    explicit SourceMerge(const EventLog* log) {
        if (log == nullptr) return;
        mLogStart = log->start().value_or(INT64_MAX);
        mNext = log->values().data();
        mEnd = mNext + log->values().size();
    }

    /** Takes what the log says before `end`. */
    void takeLogBefore(int64_t end) {
        if (mLogStart < end) startLog(std::exchange(mLogStart, INT64_MAX));
        for (; mNext != mEnd && mNext->at < end; ++mNext) takeLog(*mNext);
    }

    void takeHistory(const HistoryStep& step) {
        if (step.kind == Kind::kValue) {
            setByHistory(step.value);
        } else if (step.kind == Kind::kRecords) {
            mRecords = true;
        } else {
            pause(step);
        }
    }

private:
    /** The log begins. Its first values tell what held before them, back to here. */
    void startLog(int64_t at) {
        if (mRecords) return;
        mLooksBack[static_cast<size_t>(State::kDisplay)] = at;
        if (!mIsFull) mLooksBack[static_cast<size_t>(State::kCharge)] = at;
    }

    void takeLog(const StateValue& value) {
        ofLog(value.state) = value.value;
        const bool isKept = value.state == State::kCharge && mIsFull;
        if (!mRecords && !isKept) setByLog(value);
    }

    /** The log's last values hold from here on, but for the plug of a device that is full. */
    void pause(const HistoryStep& step) {
        mRecords = false;
        mIsFull = step.kind == Kind::kFull;
        for (const State state : {State::kDisplay, State::kCharge}) {
            const bool isKept = state == State::kCharge && mIsFull;
            if (ofLog(state) && !isKept) setByLog({step.at, state, *ofLog(state)});
        }
    }

    /** Before the first toggle that the log holds, the display was the opposite. */
    void setByLog(const StateValue& value) {
        if (const auto at = takeLookBack(value.state); at && value.state == State::kDisplay) {
            course.add(
                    {*at, State::kDisplay, value.value == kDisplayOn ? kDisplayOff : kDisplayOn});
        }
        course.add(value);
    }

    void setByHistory(const StateValue& value) {
        if (const auto at = takeLookBack(value.state)) course.add({*at, value.state, value.value});
        course.add(value);
    }

    /** From when on the first value of `state` tells what it was before. */
    std::optional<int64_t> takeLookBack(State state) {
        if (state != State::kDisplay && state != State::kCharge) return std::nullopt;
        return std::exchange(mLooksBack[static_cast<size_t>(state)], std::nullopt);
    }

    std::optional<int>& ofLog(State state) { return mOfLog[static_cast<size_t>(state)]; }

    // What is left of the log.
    int64_t mLogStart = INT64_MAX;
    const StateValue* mNext = nullptr;
    const StateValue* mEnd = nullptr;

    bool mRecords = false;                     // the history does
    bool mIsFull = false;                      // in its last pause the battery was full
    std::array<std::optional<int>, 2> mOfLog;  // the log's last values, by State
    std::array<std::optional<int64_t>, 2> mLooksBack;
};

}  // namespace

std::optional<int> StateCourse::at(State state, int64_t at) const {
    const int64_t end = cutToSecond(at) + kMsPerSecond;
    const auto& values = of(state);
    const auto next = std::partition_point(values.begin(), values.end(),
                                           [&](const StateValue& v) { return v.at < end; });
    return next == values.begin() ? std::nullopt : std::optional(std::prev(next)->value);
}

// In one moment the log's lines come after a step of the history, but before a pause: they belong
// to the history's time when it begins to record, and to the log's when it ends.
StateCourse mergeSources(const BatteryHistory* history, const EventLog* log) {
    SourceMerge merge(log);
    if (history != nullptr) {
        for (const HistoryStep& step : history->steps()) {
            const bool isPause = step.kind != Kind::kValue && step.kind != Kind::kRecords;
            merge.takeLogBefore(isPause ? step.at + 1 : step.at);
            merge.takeHistory(step);
        }
    }
    merge.takeLogBefore(INT64_MAX);
    return merge.course;
}

}  // namespace capture
