#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "capture/CaptureImport.h"
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

    /** Plays all inputs as captures of one device, merged. */
    std::optional<trace::Failure> playMerged(Device* device);

    /** Prints the trace that is made of the capture `file`. */
    std::optional<trace::Failure> printTrace(InputFile file);

    /** Prints the trace that is made of all inputs, captures of one device. */
    std::optional<trace::Failure> printMerged();

private:
    std::optional<trace::Failure> playCapture(const std::string& name,
                                              const capture::ImportedCapture& imported,
                                              const Device& device);
    std::optional<trace::Failure> playLines(InputFile* file, const report::Input& input,
                                            Device* device);
    std::optional<trace::Failure> printCapture(const capture::ImportedCapture& imported);

    static std::optional<trace::Failure> add(InputFile* file, capture::CaptureImport* import);
    std::optional<trace::Failure> addAll(capture::CaptureImport* import);

    /** Tells of the warnings. Returns the error, if there is one. */
    static std::optional<trace::Failure> tell(const capture::ImportedCapture& imported);

    void playTrace(trace::TraceReader* reader, Device* device, const trace::TraceLine& first);

    const Options& mOptions;
    Progress* const mProgress;
    size_t mPlayed = 0;  // files
    report::Stdout mOut;
    std::vector<std::unique_ptr<report::Report>> mReports;
    bool mWantsCalls = false;
    bool mPrintedTrace = false;
    std::optional<trace::Failure> mFailure;
};

}  // namespace replay
