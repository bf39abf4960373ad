#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "base/LineReader.h"
#include "base/Result.h"
#include "trace/TraceLine.h"

namespace trace {

/** Reads a trace line by line. Forked processes may go on with copies of it, one at a time. */
class TraceReader {
public:
    /** `name` is the file's name, for messages and to find pictures beside it. */
    TraceReader(std::string name, base::LineReader* lines)
          : mName(std::move(name)),
            mLines(lines) {}

    const std::string& name() const { return mName; }

    /** From now on the trace ends before a torn last line: wrong, and without a line feed. */
    void allowTornEnd() { mAllowsTornEnd = true; }

    /** Whether the trace has ended so, at `lineNumber()`. */
    bool isTorn() const { return mIsTorn; }

    /** Judges the next line that is neither blank nor a comment; false at the end. */
    base::Result<bool> next(TraceLine* line);

    /** Judges `text` as the line that stands at `lineNumber()`. */
    base::Result<void> judge(std::string_view text, TraceLine* line);

    int64_t lineNumber() const { return mLines->lineNumber(); }

    /** Whether `next` will not have to wait for input. */
    bool hasLine() const { return mLines->hasLine(); }

private:
    tl::unexpected<base::Failure> fail(const std::string& what) const {
        return base::fail(base::at(mName, lineNumber()) + what);
    }

    const std::string mName;
    base::LineReader* const mLines;
    TraceParser mParser;
    bool mAllowsTornEnd = false;
    bool mIsTorn = false;
};

}  // namespace trace
