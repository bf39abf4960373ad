#pragma once

#include <optional>
#include <string>
#include <utility>

#include "base/OutputFile.h"
#include "base/Result.h"
#include "day/Journal.h"
#include "report/Compare.h"
#include "report/Report.h"
#include "report/page/PageWriter.h"

namespace report {

/**
 * The summary as one HTML file with a picture of each day, of one input or of several. It needs no
 * network; what comes from outside is text in it and never markup.
 */
class Page : public Report {
public:
    /**
     * Writes `file`, which must outlive this, when the last input has ended. Of the inputs the
     * first `baselines` are a baseline: if there are any, how the others differ comes first.
     */
    Page(base::OutputFile* file, size_t baselines) : mFile(file), mSides(baselines) {}

    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override { mWriter.begin(name); }
    void take(const trace::Record& record) override { mWriter.take(record); }
    void end(bool isWhole) override;
    void finish() override;
    const std::optional<base::Failure>& failure() const override { return mFailure; }

private:
    base::OutputFile* const mFile;
    day::JournalWriter mWriter;
    ComparedSides mSides;
    page::PageWriter mPages;
    std::optional<base::Failure> mFailure;
};

}  // namespace report
