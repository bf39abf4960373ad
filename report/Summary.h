#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "day/Journal.h"
#include "report/Report.h"
#include "report/Terminal.h"

namespace report {

/** What a person wants to know first of each input: who used what, and what the device reports. */
class Summary : public Report {
public:
    Summary(Stdout* out, const Looks& looks)
          : mOut(out),
            mTerminal(out, looks),
            mLimit(looks.rows()) {}

    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override;
    void take(const trace::Record& record) override { mJournal.take(record); }
    void took(int64_t ns) override { mTook = ns; }
    void end(bool isWhole) override;

private:
    void printCaptures();
    void printFindings();
    void printOnNow(size_t capture);
    void printDay(const day::Day& day);
    void printSinceCharge(size_t capture);
    void printReports();
    void printEvents(const std::vector<const day::Event*>& events);
    void printEvent(const day::Event& event);
    void printCauses();
    void printEnd(bool isWhole);

    Stdout* const mOut;
    Terminal mTerminal;
    const size_t mLimit;
    day::Journal mJournal;
    int64_t mTook = 0;  // real time, ns
};

}  // namespace report
