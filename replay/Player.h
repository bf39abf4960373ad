#pragma once

#include <cstdint>
#include <optional>

#include "report/Record.h"
#include "trace/Failure.h"
#include "trace/TraceLine.h"
#include "trace/TraceReader.h"

namespace replay {

/** How a process starts. */
struct Boot {
    trace::BootKind kind = trace::BootKind::kDevice;
    int64_t at = 0;  // nanoseconds of the clock, new or old
};

/** Why a process ended: by a boot line, or because the input was over. */
using NextBoot = std::optional<Boot>;

/** "device" or "process". */
const char* bootName(trace::BootKind kind);

/** Where a player reads and writes. */
struct Channels {
    trace::TraceReader* reader;
    report::RecordWriter* records;
    bool recordsCalls;  // make a record of each call as well
};

/**
 * Plays one boot of the library in this process, which must be a fresh one: starts the clock as
 * `boot` says, carries out `first`, if there is one, and then the lines up to the next boot line.
 * On a failure, `*failure` is set and nothing more has run.
 */
NextBoot play(const Boot& boot, const trace::TraceLine* first, const Channels& channels,
              std::optional<trace::Failure>* failure);

}  // namespace replay
