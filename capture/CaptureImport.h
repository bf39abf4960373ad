#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "trace/LineReader.h"

namespace capture {

/** What became of a device capture. */
struct ImportedCapture {
    std::string trace;                  // JSON Lines, as sensor-replay reads them
    std::vector<std::string> warnings;  // one line each
    std::string error;                  // what is wrong, in one line; empty if nothing is
};

/**
 * Makes a trace of a device capture: the text of `dumpsys sensorservice`, or a bug report that
 * holds it, from `firstLine`, which `reader` has just returned, to the reader's end. `name` is the
 * file's name for warnings and errors.
 *
 * The trace's clock starts at the midnight before the oldest registration. Each registration
 * becomes an enable or a disable; the calls that a host makes at its start and every hour stand
 * between them; it ends after the last day's reports.
 */
ImportedCapture importCapture(const std::string& name, std::string_view firstLine,
                              trace::LineReader* reader);

}  // namespace capture
