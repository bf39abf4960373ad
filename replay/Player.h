#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "base/Result.h"
#include "trace/Record.h"
#include "trace/TraceLine.h"
#include "trace/TraceReader.h"

namespace replay {

/** How a process starts. */
struct Boot {
    trace::BootKind kind = trace::BootKind::kDevice;
    int64_t at = 0;    // nanoseconds of the clock, new or old
    std::string note;  // of the boot line, as JSON; may be empty
};

/** Why a process ended: by a boot line, or because the input was over. */
using NextBoot = std::optional<Boot>;

/** Where a player reads and writes. */
struct Channels {
    trace::TraceReader* reader;
    trace::RecordWriter* records;
    trace::WantedRecords wanted;
};

/**
 * Loads the library into this process, for boots that will be forked from it. Its static
 * initialisers run here, once, and see no properties: for inputs that set none before their first
 * call.
 */
void preload();

/**
 * Plays one boot of the library in this process, which must be a fresh one: starts the clock as
 * `boot` says, carries out `first`, if there is one, and then the lines up to the next boot line.
 * After a failure nothing more has run.
 */
base::Result<NextBoot> play(const Boot& boot, const trace::TraceLine* first,
                            const Channels& channels);

}  // namespace replay
