#pragma once

#include <string>
#include <vector>

#include "base/Json.h"
#include "day/UseTracker.h"
#include "report/Report.h"
#include "report/Stdout.h"

namespace report {

/**
 * What happened as JSON Lines, in the order in which it happened. A use is told when it has ended,
 * behind all that the library did in that moment.
 */
class JsonLines : public Report {
public:
    /** `withFile`: each line ends with the input's name. */
    JsonLines(Stdout* out, bool withFile);

    trace::WantedRecords wanted() const override { return {mHasNotes, false}; }
    void begin(const std::string& name) override;
    void take(const trace::Record& record) override;
    void end(bool isWhole) override;

private:
    template <typename Write>
    void writeLine(int64_t at, const Write& write);
    void writeRecord(const trace::Record& record);
    void writeCapture(int64_t at);

    /** Writes the uses that ended before `before`, and what stands at the end of what is known. */
    void writeEnded(int64_t before);
    void writeUse(const day::Use& use);
    void writeTaken(const trace::TakenNote& taken, int64_t at);

    Stdout* const mOut;
    const bool mWithFile;
    std::string mName;
    std::string mLine;
    day::UseTracker mTracker;
    day::EndedUses mEnded;
    bool mHasNotes = false;
    bool mHasTold = false;   // the capture, of the present device
    bool mIsClosed = false;  // what stands at the end of what is known has been told
};

/** What happened as lines for a person, in the order in which it happened. */
class LogLines : public Report {
public:
    explicit LogLines(Stdout* out) : mOut(out) {}

    void take(const trace::Record& record) override;

private:
    Stdout* const mOut;
};

}  // namespace report
