#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include <simdjson.h>

#include "platform/Display.h"
#include "trace/CallTable.h"

namespace trace {

enum class BootKind { kDevice, kProcess };

/** One line of a trace, judged: its action is known to be in order and can be carried out. */
struct TraceLine {
    enum class Action { kNone, kCall, kSet, kProperty, kDisplay, kBoot };

    int64_t at = 0;  // nanoseconds of the monotonic clock
    Action action = Action::kNone;

    // kCall: an index into calls.inc, and what it takes
    size_t call = 0;
    std::vector<Argument> arguments;

    // kSet: indices into calls.inc
    std::vector<std::pair<size_t, int32_t>> variables;

    // kProperty: no value deletes
    std::vector<std::pair<std::string, std::optional<std::string>>> properties;

    // kDisplay: a picture has been read already
    platform::DisplayChange display;

    // kBoot
    BootKind boot = BootKind::kDevice;
};

/** The name of a call, as a trace writes it. */
std::string_view callName(size_t index);

/** Judges lines one by one; whether times go back is the caller's business. */
class TraceParser {
public:
    /**
     * Parses `text`, behind which `LineReader::kPadding` bytes must be readable, into `*line`.
     * Pictures are looked for beside the file `trace`. Returns nothing, or what is wrong with the
     * line; `*line` is then not to be used.
     */
    std::optional<std::string> parse(std::string_view text, const std::string& trace,
                                     TraceLine* line);

private:
    simdjson::dom::parser mParser;
    simdjson::ondemand::parser mNumberParser;
};

/** Whether a line is blank or a comment. */
bool isSkipped(std::string_view text);

}  // namespace trace
