#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "report/Journal.h"
#include "report/Report.h"
#include "report/Stdout.h"

namespace report {

/** What a person wants to know first of each input: who used what, and what the device reports. */
class Summary : public Report {
public:
    /** `showsAll`: tables show all rows, not the first 20. */
    Summary(Stdout* out, bool showsAll, bool hasColours);

    bool wantsCalls() const override { return true; }
    void begin(const Input& input) override;
    void take(const Record& record) override { mJournal.take(record); }
    void end(bool isWhole) override;

private:
    void printOrigin();
    void printDay(const Day& day);
    void printEvent(const Event& event);
    void printReasons();
    void printEnd(bool isWhole);
    void printHeading(const std::string& text);
    std::string emphasised(const std::string& text) const;

    Stdout* const mOut;
    const size_t mLimit;
    const bool mHasColours;
    Journal mJournal;
    int64_t mStarted = 0;  // real time, ns
};

}  // namespace report
