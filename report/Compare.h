#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "day/Comparison.h"
#include "day/Journal.h"
#include "report/Report.h"
#include "report/Section.h"
#include "report/Stdout.h"
#include "report/Terminal.h"

namespace report {

inline constexpr char kNothingDiffers[] = "Nothing differs.";

/** Inputs and a baseline: the first inputs are the baseline's. */
class ComparedSides {
public:
    /** `baselines`: how many; with none nothing is compared. */
    explicit ComparedSides(size_t baselines) : mBaselines(baselines) {}

    /** Takes an input that has ended. */
    void add(const day::Journal& journal);

    /** Nothing if a side has no input. */
    std::optional<day::Comparison> compare() const;

    /** The same laid out: what it covers, and a part for each kind of difference. */
    std::optional<Section> layOut(size_t limit) const;

private:
    const size_t mBaselines;
    std::vector<day::Profile> mBefore;
    std::vector<day::Profile> mAfter;
};

/** Inputs against a baseline. */
class Compare : public Report {
public:
    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override { mWriter.begin(name); }
    void take(const trace::Record& record) override { mWriter.take(record); }
    void end(bool isWhole) override;

protected:
    explicit Compare(size_t baselines) : mSides(baselines) {}

    const ComparedSides& sides() const { return mSides; }

private:
    day::JournalWriter mWriter;
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
