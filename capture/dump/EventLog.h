#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "capture/dump/StateValue.h"
#include "capture/dump/WallTime.h"

namespace capture {

/** What a device's event log says of its display and its charger. */
class EventLog {
public:
    /** `taken`: when the capture was taken, which gives the lines their year, if that is known. */
    explicit EventLog(std::optional<int64_t> taken) : mTaken(taken) {}

    /** Takes a line; ignores those of an unknown form. */
    void takeLine(std::string_view text);

    /** Says when the capture was taken, if that was not known at the start. */
    void finish(int64_t taken);

    /** Whether lines have been taken. */
    bool hasLines() const { return mStart || !mWaiting.empty(); }

    /** The time of the first line. */
    const std::optional<int64_t>& start() const { return mStart; }

    /** In the order of the lines, whose times do not go back. */
    const std::vector<StateValue>& values() const { return mValues; }

private:
    struct Line {
        YearlessTime time;
        std::optional<StateValue> value;  // without its time
    };

    void take(const Line& line);

    std::optional<int64_t> mTaken;
    std::vector<Line> mWaiting;  // for their year
    std::optional<int64_t> mStart;
    int64_t mTime = 0;  // of the last line
    std::vector<StateValue> mValues;
};

}  // namespace capture
