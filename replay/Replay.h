#pragma once

#include "replay/Options.h"

namespace replay {

/**
 * Plays `options.files`. The output is that of one after another. Captures are devices of their own
 * and may be played at once; traces are the days of one device, as if a device boot joined them.
 * With a property file, all are days of the device whose properties it keeps. The first file that
 * is wrong ends the run. Returns the exit status; what is wrong has been said on standard error.
 */
int replayFiles(const Options& options);

}  // namespace replay
