#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "capture/ImportedCapture.h"
#include "replay/BootProcess.h"
#include "replay/InputFile.h"
#include "replay/Options.h"
#include "replay/Progress.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "trace/Failure.h"
#include "trace/TraceReader.h"

namespace replay {

/** Plays inputs and makes of them what the options ask for. */
class FilePlayer {
public:
    FilePlayer(const Options& options, Progress* progress);

    /**
     * Plays `file`, each boot in a process of its own. A capture is a device of its own; traces are
     * played on `device`, one after another. Returns nothing, or why it had to stop.
     */
    std::optional<trace::Failure> play(InputFile file, Device* device);

    /** Prints the trace that is made of the capture `file`. */
    std::optional<trace::Failure> printTrace(InputFile file);

private:
    std::optional<trace::Failure> importTrace(InputFile* file, capture::ImportedCapture* imported);
    void playTrace(trace::TraceReader* reader, Device* device, const trace::TraceLine& first);

    Progress* const mProgress;
    size_t mPlayed = 0;  // files
    report::Stdout mOut;
    std::vector<std::unique_ptr<report::Report>> mReports;
    bool mWantsCalls = false;
    bool mPrintedTrace = false;
    std::optional<trace::Failure> mFailure;
};

}  // namespace replay
