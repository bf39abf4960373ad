#pragma once

#include <cstdint>
#include <string>

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
    void take(const trace::Record& record) override { mWriter.take(record); }
    void took(int64_t ns) override { mTook = ns; }
    void end(bool isWhole) override;

private:
    Stdout* const mOut;
    Terminal mTerminal;
    const size_t mLimit;
    day::JournalWriter mWriter;
    int64_t mTook = 0;  // real time, ns
};

}  // namespace report
