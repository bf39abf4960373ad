#pragma once

#include <string>
#include <vector>

#include "trace/Origin.h"

namespace capture {

/** What became of a device's capture, or of several. */
struct ImportedCapture {
    std::string trace;                  // JSON Lines, as sensor-replay reads them
    std::vector<std::string> warnings;  // one line each
    std::string error;                  // what is wrong, in one line; empty if nothing is
    trace::Origin origin;
};

}  // namespace capture
