#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "base/Result.h"
#include "capture/DumpJoin.h"
#include "capture/ImportedCapture.h"
#include "capture/JoinedDay.h"
#include "capture/NamedDump.h"

namespace capture {

/** Makes one trace of a device's dumps. */
class TraceBuilder {
public:
    /** Each dump must have registrations. `warnings`: those of reading the dumps. */
    TraceBuilder(std::vector<NamedDump> dumps, std::vector<std::string> warnings) {
        mDay.dumps = std::move(dumps);
        mDay.warnings = std::move(warnings);
    }

    /** Fails if dumps do not meet and nothing tells their order. To be called once. */
    base::Result<ImportedCapture> build();

private:
    /** A failure if that cannot be done. */
    std::optional<base::Failure> joinDumps();
    void readStates();
    void readUses();

    /** What a dump says of states; nothing, with a warning, where that cannot be dated. */
    StateCourse statesOf(const NamedDump& dump);

    /** Registrations are of one run of the system, so there should be no other. */
    void warnOfRuns(const NamedDump& dump);

    /** Captures of different devices do not make one day. */
    void warnOfStrangers();

    void warnOfLeftOut();

    std::string printedTime(size_t line) const;
    void warn(const std::string& file, int64_t lineNumber, const std::string& text);
    void warn(const DumpLine& line, const std::string& text);

    JoinedDay mDay;
};

}  // namespace capture
