#pragma once

#include <optional>
#include <string>

#include "report/Output.h"
#include "trace/LineReader.h"
#include "trace/TraceLine.h"

namespace replay {

/** How a process starts. */
struct Boot {
    trace::BootKind kind = trace::BootKind::kDevice;
    int64_t at = 0;  // nanoseconds of the clock, new or old
};

/** Why a process ended: by a boot line, or because the input was over. */
using NextBoot = std::optional<Boot>;

/** A line that the tool will not carry out, or a tool that cannot go on. */
struct Failure {
    std::string text;  // one line for standard error
    int status;        // of the exit
};

inline constexpr int kStatusFailed = 1;
inline constexpr int kStatusBadInput = 2;

/**
 * The next line of `reader` that is neither blank nor a comment, judged into `*line`; false at the
 * end. `name` is the file's name. On a failure, `*failure` says what is wrong.
 */
bool readLine(const std::string& name, trace::LineReader* reader, trace::TraceParser* parser,
              trace::TraceLine* line, std::optional<Failure>* failure);

/**
 * Plays one boot of the library in this process, which must be a fresh one: starts the clock as
 * `boot` says, carries out `first`, if there is one, and then the lines of `reader` up to the next
 * boot line. On a failure, `*failure` is set and nothing more has run.
 */
NextBoot play(const Boot& boot, const trace::TraceLine* first, const std::string& name,
              trace::LineReader* reader, report::Output* output, std::optional<Failure>* failure);

}  // namespace replay
