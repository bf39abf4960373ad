#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "capture/dump/StateValue.h"
#include "trace/Note.h"

namespace capture {

/** An app switches a sensor on or off. */
struct EnableCall {
    bool on = false;
    int32_t type = 0;
    std::string_view package;
    std::string_view opPackage;
    int64_t periodUs = 0;  // of an on
};

/**
 * Writes the calls that a host makes in a day, or in several, as a trace. Times are milliseconds
 * since the midnight before the first; they must not go back. Before each line stand the hourly
 * calls that are due by then.
 */
class HostDay {
public:
    /** The host starts at `start`. */
    HostDay(int64_t start, std::string* trace);

    /** What the host calls when it starts. */
    void writeStart();

    void writeState(int64_t at, State state, int value);
    void writeEnable(int64_t at, const EnableCall& call, const trace::Note& note);

    /** A line that lets time pass; without a call, but for those that are due. */
    void writeLine(int64_t at, const trace::Note& note);

    /** Lets time pass up to the end of the trace. */
    void writeEnd(int64_t at);

    /** When the reports of the day have been made on which `last` lies. */
    static int64_t endOf(int64_t last);

private:
    /** The hourly calls due at or before `time` that have not been made. */
    void writeTicksUpTo(int64_t time);
    void writeReports(int64_t at);
    void writeResets(int64_t at);

    void writeCall(int64_t at, std::string_view name);
    void writeCall(int64_t at, std::string_view name, int64_t argument);

    const int64_t mStart;
    std::string* const mTrace;
    int64_t mNextHour;    // since midnight of the first day
    bool mReset = false;  // of that hour's calls, the reports have been made
};

}  // namespace capture
