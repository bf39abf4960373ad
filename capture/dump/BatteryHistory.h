#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "capture/dump/HistoryLine.h"
#include "capture/dump/StateValue.h"

namespace capture {

/** What a battery history says at a moment. */
struct HistoryStep {
    enum class Kind {
        kRecords,  // it records from here on
        kFull,     // it pauses, because the battery is full and the device is plugged
        kPause,    // it pauses for another reason
        kValue,    // a state changes
    };

    int64_t at;  // a wall time
    Kind kind;
    StateValue value{};  // of kValue
};

/** A start or a shutdown of the system. */
struct SystemRun {
    int64_t at;
    int64_t lineNumber;
};

/**
 * The course of a device's states by its battery history. A history without any clock time, but
 * with lines, tells nothing.
 */
class BatteryHistory {
public:
    /** `taken`: when the capture was taken, which gives the lines their year, if that is known. */
    BatteryHistory(HistoryFormat format, std::optional<int64_t> taken)
          : mFormat(format),
            mTaken(taken) {}

    /** Takes a line without blanks around it; ignores those of an unknown form. */
    void takeLine(std::string_view text, int64_t lineNumber);

    /** Says when the capture was taken, if that was not known at the start. */
    void finish(int64_t taken);

    bool hasLines() const { return mHasLines; }

    /** Whether its lines can be dated. */
    bool hasTimes() const { return mAnchor || mFormat == HistoryFormat::kLocalTime; }

    /** In the order of the lines, whose times do not go back. */
    const std::vector<HistoryStep>& steps() const { return mSteps; }

    const std::vector<SystemRun>& systemRuns() const { return mSystemRuns; }

private:
    struct NumberedLine {
        HistoryLine line;
        int64_t lineNumber;
    };

    /** A line at which the clock's time is known. */
    struct Anchor {
        int64_t prefix;
        int64_t time;
    };

    void takeByYear(const NumberedLine& line);
    void takeByAnchor(const NumberedLine& line);
    void takeStamp(const NumberedLine& line);

    /** Takes a line whose time is known. */
    void takeAt(int64_t time, const NumberedLine& line);
    void start();
    void shutdown();
    void record(const HistoryLine& line);
    void resume();
    void pause(HistoryStep::Kind kind);
    void addValue(State state, int value);

    HistoryFormat mFormat;
    std::optional<int64_t> mTaken;
    bool mHasLines = false;
    std::vector<NumberedLine> mWaiting;  // for their year, or since a start for its time
    std::optional<Anchor> mAnchor;
    bool mStarting = false;  // since a start there was no time

    bool mBegun = false;     // a reset, start or time has come
    int64_t mTime = 0;       // of the last line
    bool mRecords = false;   // see HistoryStep::Kind
    bool mComplete = false;  // the next record names all flags that are on
    bool mFull = false;      // by the last status
    bool mPlugged = true;    // until the history says otherwise
    std::vector<HistoryStep> mSteps;
    std::vector<SystemRun> mSystemRuns;
};

}  // namespace capture
