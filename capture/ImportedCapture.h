#pragma once

#include <string>
#include <vector>

namespace capture {

/** What became of a device's capture, or of several. */
struct ImportedCapture {
    std::string trace;                  // JSON Lines, as sensor-replay reads them
    std::vector<std::string> warnings;  // one line each
};

}  // namespace capture
