#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "capture/Dating.h"
#include "capture/DumpJoin.h"
#include "capture/HostDay.h"
#include "capture/ImportedCapture.h"
#include "capture/Source.h"
#include "capture/StateStretches.h"

namespace capture {

/** Makes one trace of a device's dumps. */
class TraceBuilder {
public:
    /** Each dump must have registrations; they are taken out. */
    TraceBuilder(std::vector<Source>* sources, ImportedCapture* result)
          : mSources(*sources),
            mResult(*result) {}

    void build();

private:
    void joinDumps();
    void readStates();

    /** What a dump says of states; nothing, with a warning, where that cannot be dated. */
    StateCourse statesOf(const Source& source);

    /** When a dump was taken; no state is known after it. */
    std::optional<int64_t> endOf(const JoinedDump& dump) const;

    /** Registrations are of one run of the system, so there should be no other. */
    void warnOfRuns(const Source& source);

    void writeTrace();
    void writeLine(size_t line, HostDay* day);

    std::optional<int32_t> typeOf(const DumpLine& line) const;
    std::string printedTime(size_t line) const;
    void warn(const std::string& file, int64_t lineNumber, const std::string& text);
    void warn(const DumpLine& line, const std::string& text);

    std::vector<Source>& mSources;
    ImportedCapture& mResult;
    JoinedLines mJoined;
    Dating mDating;
    int64_t mStart = 0;  // of the trace
    StateStretches mStates;
    std::vector<const DumpLine*> mLeftOut;  // their sensors are not known
};

}  // namespace capture
