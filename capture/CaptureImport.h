#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "base/LineReader.h"
#include "base/Result.h"
#include "capture/ImportedCapture.h"
#include "capture/NamedDump.h"

namespace capture {

/**
 * Makes a trace of a device's captures: the text of `dumpsys sensorservice`, or bug reports that
 * hold it. Several captures of one device become one trace.
 *
 * The trace's clock starts at the midnight before the oldest registration. Each registration
 * becomes an enable or a disable. Between them stand the calls that a host makes at its start,
 * every hour, and when the display, the charger, the camera or a call changes, as far as the
 * captures tell that. What they tell beside that, and of the sensors that were on before and after,
 * stands in notes (trace/Note.h). The trace ends after the last day's reports.
 */
class CaptureImport {
public:
    /**
     * Reads a capture from `firstLine`, which `reader` has just returned, to the reader's end.
     * `name` is the file's name for warnings and errors. After an error nothing more is read.
     * Beside others a capture without registrations is no error, but a warning.
     */
    void add(const std::string& name, std::string_view firstLine, base::LineReader* reader);

    /** The trace of all that was added, or why there is none. */
    base::Result<ImportedCapture> finish();

private:
    /** A capture without registrations, and why it has none. */
    struct Missing {
        std::string name;
        std::string what;
    };

    std::vector<NamedDump> mDumps;
    std::vector<Missing> mMissing;
    std::vector<std::string> mWarnings;
    std::optional<base::Failure> mFailure;
};

}  // namespace capture
