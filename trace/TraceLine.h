#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "platform/Display.h"
#include "trace/CallTable.h"
#include "trace/Words.h"

namespace trace {

/** A call of the library: its place in calls.inc, and what it takes. */
struct Call {
    size_t index = 0;
    std::vector<Argument> arguments;
};

/** Writes of variables: their places in calls.inc, and their new values. */
struct VariableWrites {
    std::vector<std::pair<size_t, int32_t>> writes;
};

/** Writes of properties; no value deletes. */
struct PropertyWrites {
    std::vector<std::pair<std::string, std::optional<std::string>>> writes;
};

/** What the library did on the device that the trace was recorded on. */
struct Expectation {
    std::string entry;  // `eventEntry` or `propertyEntry` of trace/TraceWriter.h
};

/** One line of a trace, judged: its action is known to be in order and can be carried out. */
struct TraceLine {
    int64_t at = 0;  // nanoseconds of the monotonic clock
    std::variant<std::monostate, Call, VariableWrites, PropertyWrites, platform::DisplayChange,
                 Expectation, BootKind>
            action;
    std::string note;  // the object behind "note", as JSON; empty if the line has none
};

/** Judges lines one by one. Whether times go back is the caller's business. */
class TraceParser {
public:
    TraceParser();
    ~TraceParser();

    /**
     * Parses `text`, behind which `base::LineReader::kPadding` bytes must be readable, into
     * `*line`. Pictures are looked for beside the file `trace`. Returns nothing, or what is wrong
     * with the line; `*line` is then not to be used.
     */
    std::optional<std::string> parse(std::string_view text, const std::string& trace,
                                     TraceLine* line);

private:
    struct Parsers;
    const std::unique_ptr<Parsers> mParsers;
};

/** Whether a line is blank or a comment. */
bool isSkipped(std::string_view text);

}  // namespace trace
