#pragma once

#include "base/Result.h"
#include "replay/Options.h"

namespace replay {

/**
 * Prints on standard output the trace that is made of each file, a capture, or of all if they are
 * merged. Between two a boot line starts the next device's clock.
 */
base::Result<void> printTraces(const Options& options);

}  // namespace replay
