#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "capture/Registration.h"
#include "capture/StateValue.h"

namespace capture {

/**
 * Writes the calls that a host makes in a day, or in several, as a trace. Times are milliseconds
 * since the midnight before the first; they must not go back. Before each call stand the hourly
 * ones that are due by then.
 */
class HostDay {
public:
    explicit HostDay(std::string* trace) : mTrace(trace) {}

    /** The host starts. */
    void start(int64_t at);

    void state(int64_t at, State state, int value);
    void registration(int64_t at, const Registration& registration, int32_t type);

    /** Lets time pass until the last day's reports are made: that of `lastLine` or of a state. */
    void end(int64_t lastLine);

private:
    /** The hourly calls due at or before `time` that have not been made. */
    void ticksUpTo(int64_t time);
    void reports(int64_t at);
    void resets(int64_t at);

    void call(int64_t at, std::string_view name, std::string_view arguments = {});

    std::string* const mTrace;
    int64_t mLastState = 0;
    int64_t mNextHour = 0;  // since midnight of the first day
    bool mReset = false;    // of that hour's calls, the reports have been made
};

}  // namespace capture
