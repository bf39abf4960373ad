#include "capture/dump/BatteryHistory.h"

#include <algorithm>
#include <utility>

#include "capture/dump/WallTime.h"

namespace capture {

using Kind = HistoryLine::Kind;

void BatteryHistory::takeLine(std::string_view text, int64_t lineNumber) {
    const auto line = parseHistoryLine(text, mFormat);
    if (!line) return;
    mHasLines = true;
    if (mFormat == HistoryFormat::kLocalTime) {
        takeByYear({*line, lineNumber});
    } else {
        takeByAnchor({*line, lineNumber});
    }
}

void BatteryHistory::finish(int64_t taken) {
    if (mTaken || mFormat != HistoryFormat::kLocalTime) return;
    mTaken = taken;
    for (const NumberedLine& line : std::exchange(mWaiting, {})) takeByYear(line);
}

void BatteryHistory::takeByYear(const NumberedLine& line) {
    if (!mTaken) {
        mWaiting.push_back(line);
    } else if (const auto time = withYear(line.line.prefix, *mTaken)) {
        takeAt(*time, line);
    }
}

void BatteryHistory::takeByAnchor(const NumberedLine& line) {
    const Kind kind = line.line.kind;
    if (kind == Kind::kTime || kind == Kind::kReset) {
        takeStamp(line);
    } else if (kind == Kind::kStart) {
        mWaiting.assign(1, line);  // lines since an earlier start have no time
        mStarting = true;
    } else if (mStarting) {
        mWaiting.push_back(line);
    } else if (mAnchor) {
        takeAt(mAnchor->time + line.line.prefix - mAnchor->prefix, line);
    }
}

void BatteryHistory::takeStamp(const NumberedLine& line) {
    mAnchor = {line.line.prefix, line.line.stamp};
    mStarting = false;
    for (const NumberedLine& waiting : std::exchange(mWaiting, {})) {
        takeAt(line.line.stamp, waiting);
    }
    takeAt(line.line.stamp, line);
}

void BatteryHistory::takeAt(int64_t time, const NumberedLine& line) {
    const Kind kind = line.line.kind;
    mBegun |= kind == Kind::kTime || kind == Kind::kReset || kind == Kind::kStart;
    if (!mBegun) return;
    mTime = std::max(mTime, time);
    if (kind == Kind::kStart || kind == Kind::kShutdown) {
        mSystemRuns.push_back({mTime, line.lineNumber});
    }
    if (kind == Kind::kStart || kind == Kind::kReset) mComplete = true;
    switch (kind) {
        case Kind::kTime:
        case Kind::kReset:
            return resume();
        case Kind::kStart:
            return start();
        case Kind::kShutdown:
            return shutdown();
        case Kind::kOverflow:
            return pause(HistoryStep::Kind::kPause);
        case Kind::kRecord:
            return record(line.line);
    }
}

void BatteryHistory::start() {
    resume();
    for (const State state : {State::kDisplay, State::kCamera, State::kCall}) {
        addValue(state, idleValue(state));
    }
}

// The display is off, whatever the log said last.
void BatteryHistory::shutdown() {
    pause(HistoryStep::Kind::kPause);
    addValue(State::kDisplay, kDisplayOff);
}

void BatteryHistory::record(const HistoryLine& line) {
    const bool isComplete = std::exchange(mComplete, false);
    if (!mRecords) return;
    for (const State state : kStates) {
        const auto& named = line.values[static_cast<size_t>(state)];
        if (named) {
            addValue(state, *named);
        } else if (isComplete && state != State::kCharge) {
            addValue(state, idleValue(state));
        }
    }
    const auto& plug = line.values[static_cast<size_t>(State::kCharge)];
    if (plug) mPlugged = *plug != kUnplugged;
    mFull = line.full.value_or(mFull);
    if (mFull && mPlugged) pause(HistoryStep::Kind::kFull);
}

void BatteryHistory::resume() {
    if (!std::exchange(mRecords, true)) mSteps.push_back({mTime, HistoryStep::Kind::kRecords});
}

void BatteryHistory::pause(HistoryStep::Kind kind) {
    if (std::exchange(mRecords, false)) mSteps.push_back({mTime, kind});
}

void BatteryHistory::addValue(State state, int value) {
    mSteps.push_back({mTime, HistoryStep::Kind::kValue, {mTime, state, value}});
}

}  // namespace capture
