#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "base/OutputFile.h"
#include "day/UseTracker.h"
#include "report/Report.h"

namespace report {

/**
 * A table of all inputs in a file, as comma-separated values with a header: docs/output.md lists
 * the columns. The rows of an input are in the file when it has ended.
 */
class Csv : public Report {
public:
    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override;
    void end(bool isWhole) override;
    const std::optional<base::Failure>& failure() const override { return mFailure; }

protected:
    /**
     * `file` must outlive this and be new; the header is written to it at once. `takeUse` gets each
     * use when it ends.
     */
    Csv(base::OutputFile* file, std::string_view header,
        std::function<void(const day::Use&)> takeUse);

    day::UseTracker* tracker() { return &mTracker; }
    const std::string& name() const { return mName; }

    /** Rows that are not written yet. */
    std::string* rows() { return &mRows; }
    void flushIfLarge();

private:
    void flush();

    base::OutputFile* const mFile;
    std::string mName;
    std::string mRows;
    day::UseTracker mTracker;
    std::optional<base::Failure> mFailure;
};

/** A row for each use of a sensor. */
class UsesCsv : public Csv {
public:
    explicit UsesCsv(base::OutputFile* file);

    void take(const trace::Record& record) override;

private:
    void add(const day::Use& use);

    day::EndedUses mEnded;
};

/** A row for each row of the battery statistics since the last charge. */
class SinceChargeCsv : public Csv {
public:
    explicit SinceChargeCsv(base::OutputFile* file);

    void begin(const std::string& name) override;
    void take(const trace::Record& record) override;

private:
    void add(const day::Notes& notes);

    bool mIsAdded = false;  // the statistics of this capture
};

}  // namespace report
