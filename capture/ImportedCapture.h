#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace capture {

/** What became of a device's capture, or of several. */
struct ImportedCapture {
    int64_t start = 0;                  // of the trace, ms
    std::string trace;                  // JSON Lines, as sensor-replay reads them
    std::vector<std::string> warnings;  // one line each
};

}  // namespace capture
