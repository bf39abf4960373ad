#pragma once

#include <cstddef>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "base/OutputFile.h"
#include "base/Result.h"
#include "capture/CaptureImport.h"
#include "replay/BootProcess.h"
#include "replay/InputFile.h"
#include "replay/Options.h"
#include "replay/Progress.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "trace/TraceReader.h"

namespace replay {

/** Plays inputs and makes of them what the options ask for. */
class FilePlayer {
public:
    FilePlayer(const Options& options, Progress* progress);

    /** Opens the files that are written; nothing, or why one of them cannot be. */
    std::optional<base::Failure> openOutputs();

    /** What is written while an input is played: standard output, errors, tables. */
    std::vector<int> outputs() const;

    /**
     * Plays `file`, each boot in a process of its own. A capture is a device of its own; traces are
     * played on `device`, one after another. Returns nothing, or why it had to stop.
     */
    std::optional<base::Failure> play(InputFile file, Device* device);

    /** Plays all inputs as captures of one device, merged. */
    std::optional<base::Failure> playMerged(Device* device);

    /** Ends what is made of all inputs together. Returns nothing, or why it could not be made. */
    std::optional<base::Failure> finish();

    /** Prints the trace that is made of the capture `file`. */
    std::optional<base::Failure> printTrace(InputFile file);

    /** Prints the trace that is made of all inputs, captures of one device. */
    std::optional<base::Failure> printMerged();

private:
    using Import = base::Result<capture::ImportedCapture>;

    std::optional<base::Failure> playCapture(const std::string& name, const Import& imported,
                                             const Device& device);
    std::optional<base::Failure> playLines(InputFile* file, Device* device);
    std::optional<base::Failure> printCapture(const Import& imported);

    void add(std::unique_ptr<report::Report> report) { mReports.push_back(std::move(report)); }
    static std::optional<base::Failure> add(InputFile* file, capture::CaptureImport* import);
    std::optional<base::Failure> addAll(capture::CaptureImport* import);

    /** Tells of the warnings. Returns the error, if there is one. */
    static std::optional<base::Failure> tell(const Import& imported);

    void playTrace(trace::TraceReader* reader, Device* device, const trace::TraceLine& first);

    /** What the reports want to hear of the next boot. */
    trace::WantedRecords wantedRecords() const;

    const Options& mOptions;
    Progress* const mProgress;
    size_t mPlayed = 0;  // files
    report::Stdout mOut;
    std::deque<base::OutputFile> mFiles;  // in place: reports write to them
    std::vector<int> mTables;             // descriptors of those that get rows as inputs end
    std::vector<std::unique_ptr<report::Report>> mReports;
    bool mPrintedTrace = false;
    std::optional<base::Failure> mFailure;
};

}  // namespace replay
