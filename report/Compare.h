#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "day/Comparison.h"
#include "day/Journal.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "report/Table.h"
#include "report/Terminal.h"

namespace report {

/** A part of a comparison: a heading, and a table or a sentence. */
struct ComparedPart {
    std::string heading;
    std::string caption;  // of the table
    Table table;
    std::string sentence;  // where the table is empty
};

/** A comparison laid out: what it covers, a line each, and its parts. */
struct ComparisonText {
    std::vector<std::string> coverage;
    std::vector<ComparedPart> parts;
};

/** Inputs and a baseline: the first inputs are the baseline's. */
class ComparedSides {
public:
    /** `baselines`: how many; with none nothing is compared. */
    explicit ComparedSides(size_t baselines) : mBaselines(baselines) {}

    /** Takes an input that has ended. */
    void add(const day::Journal& journal);

    /** Nothing if a side has no input. */
    std::optional<day::Comparison> compare() const;
    std::optional<ComparisonText> layOut(size_t limit) const;

private:
    const size_t mBaselines;
    std::vector<day::Profile> mBefore;
    std::vector<day::Profile> mAfter;
};

/** Inputs against a baseline. */
class Compare : public Report {
public:
    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override { mJournal.begin(name); }
    void take(const trace::Record& record) override { mJournal.take(record); }
    void end(bool isWhole) override;

protected:
    explicit Compare(size_t baselines) : mSides(baselines) {}

    const ComparedSides& sides() const { return mSides; }

private:
    day::Journal mJournal;
    ComparedSides mSides;
};

/** The comparison for a person. */
class CompareSummary : public Compare {
public:
    CompareSummary(Stdout* out, size_t baselines, const Looks& looks)
          : Compare(baselines),
            mOut(out),
            mTerminal(out, looks),
            mLimit(looks.rows()) {}

    void finish() override;

private:
    Stdout* const mOut;
    Terminal mTerminal;
    const size_t mLimit;
};

/** The comparison as JSON Lines, a line for each difference. */
class CompareLines : public Compare {
public:
    CompareLines(Stdout* out, size_t baselines) : Compare(baselines), mOut(out) {}

    void finish() override;

private:
    Stdout* const mOut;
};

}  // namespace report
