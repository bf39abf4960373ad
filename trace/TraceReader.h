#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "trace/Failure.h"
#include "trace/LineReader.h"
#include "trace/TraceLine.h"

namespace trace {

/** Reads a trace line by line. Forked processes may go on with copies of it, one at a time. */
class TraceReader {
public:
    /** `name` is the file's name, for messages and to find pictures beside it. */
    TraceReader(std::string name, LineReader* lines) : mName(std::move(name)), mLines(lines) {}

    const std::string& name() const { return mName; }

    /**
     * Judges the next line that is neither blank nor a comment; false at the end. On a failure,
     * `*failure` says what is wrong.
     */
    bool next(TraceLine* line, std::optional<Failure>* failure);

    /** Judges `text` as the line that stands at `lineNumber()`. */
    bool judge(std::string_view text, TraceLine* line, std::optional<Failure>* failure);

    /** The text of the last line; valid until the next one. */
    std::string_view text() const { return mText; }
    int64_t lineNumber() const { return mLines->lineNumber(); }

    /** Whether `next` will not have to wait for input. */
    bool hasLine() const { return mLines->hasLine(); }

private:
    bool fail(const std::string& what, std::optional<Failure>* failure) const;

    const std::string mName;
    LineReader* const mLines;
    TraceParser mParser;
    std::string_view mText;
};

}  // namespace trace
