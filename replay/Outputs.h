#pragma once

#include <cstdint>
#include <deque>
#include <memory>
#include <optional>
#include <vector>

#include "base/OutputFile.h"
#include "base/Result.h"
#include "replay/Options.h"
#include "replay/Progress.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "trace/Record.h"

namespace replay {

/** An output in a file of its own. A new one is a `Report` and a row of `fileOutputs`. */
struct FileOutput {
    const char* option;  // "--page"
    const char* help;
    std::unique_ptr<report::Report> (*make)(base::OutputFile* file, const Options& options);
};

/** All of them, in the order in which `--help` lists them. */
const std::vector<FileOutput>& fileOutputs();

/**
 * What the options ask for, made of the records of all inputs: reports on standard output and in
 * files. One thread at a time may use it.
 */
class Outputs {
public:
    /** `progress` must outlive this; what stands on the terminal is cleared before an output. */
    Outputs(const Options& options, Progress* progress);

    /** Opens the files that are written. */
    base::Result<void> open(const Options& options);

    /** Takes what happens: records, inputs that begin and end, warnings, a failure. */
    void take(const trace::Record& record);

    /** What the reports want to hear of the next boot. */
    trace::WantedRecords wanted() const;

    /** Hands on what was gathered for standard output. */
    void flush() { mOut.flush(); }

    /** Why no more inputs may be played: the failure taken, or what a report found wrong. */
    const std::optional<base::Failure>& failure() const { return mFailure; }

    /** Ends what is made of all inputs together. */
    base::Result<void> finish();

private:
    void add(std::unique_ptr<report::Report> report) { mReports.push_back(std::move(report)); }
    void endInput(int64_t tookNs);

    Progress* const mProgress;
    report::Stdout mOut;
    std::deque<base::OutputFile> mFiles;  // in place: reports write to them
    std::vector<std::unique_ptr<report::Report>> mReports;
    std::optional<base::Failure> mFailure;
};

}  // namespace replay
