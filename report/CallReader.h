#pragma once

#include <string>

#include "report/Record.h"
#include "trace/TraceLine.h"

namespace report {

/** Reads the calls that stand in records. */
class CallReader {
public:
    /** The call of a record `kCall`; valid until the next one. */
    const trace::Call& read(const Record& record);

private:
    trace::TraceParser mParser;
    trace::TraceLine mLine;
    std::string mText;  // of the line, with the bytes behind it that the parser wants
};

}  // namespace report
