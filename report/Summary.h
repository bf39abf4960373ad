#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "day/Journal.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "report/Table.h"

namespace report {

/** What a person wants to know first of each input: who used what, and what the device reports. */
class Summary : public Report {
public:
    /**
     * `showsAll`: tables show all rows, not the first 20. `columns`: of the terminal; without,
     * nothing is cut.
     */
    Summary(Stdout* out, bool showsAll, bool hasColours, std::optional<size_t> columns);

    trace::WantedRecords wanted() const override { return {true, false}; }
    void begin(const std::string& name) override;
    void take(const trace::Record& record) override { mJournal.take(record); }
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
    void printHeading(const std::string& text);
    void printTable(const Table& table, size_t indent);

    /** A name, cut where the terminal ends; a sentence, broken there. */
    void printName(const std::string& text, size_t indent);
    void printSentence(const std::string& text, size_t indent);
    std::string emphasised(const std::string& text) const;

    Stdout* const mOut;
    const size_t mLimit;
    const bool mHasColours;
    const std::optional<size_t> mColumns;
    day::Journal mJournal;
    int64_t mStarted = 0;  // real time, ns
};

}  // namespace report
