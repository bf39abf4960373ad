#pragma once

#include <cstdint>
#include <deque>
#include <optional>
#include <string>

#include "base/Result.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "trace/Note.h"

namespace report {

/**
 * Compares the events and properties of a replay with the "expect" lines of its trace, in order and
 * without regard to their times.
 *
 * A record that has lost lines consists of stretches, each of which counts by itself: one ends
 * where the trace notes the loss and starts again with a boot line. What the replay does at the end
 * of a stretch, after the first line that is lost, has nothing to be compared with.
 */
class Check : public Report {
public:
    explicit Check(Stdout* out) : mOut(out) {}

    void begin(const std::string& name) override;
    void take(const trace::Record& record) override;

    /**
     * Says on standard output how many expectations the replay has met, for each stretch that it
     * has met as a whole, what is missing in the trace, and what hung when it was recorded.
     */
    void end(bool isWhole) override;

    /** The first difference, or that there was nothing to compare with. */
    const std::optional<base::Failure>& failure() const override { return mFailure; }

private:
    struct Entry {
        std::string text;
        int64_t at;    // nanoseconds
        int64_t line;  // of an expectation
    };

    void takeNote(const trace::Note& note, int64_t line);
    void compare();
    void endProcess(int64_t at);
    void endStretch();
    void differ(const Entry* expected, const Entry* given);

    Stdout* const mOut;
    std::string mName;
    std::deque<Entry> mExpected;  // not compared yet; either queue is empty
    std::deque<Entry> mGiven;
    std::optional<trace::LostNote> mLost;  // in the present stretch
    std::string mTold;                     // what the trace notes of the record, a line each
    std::string mDoubts;                   // why the replay may differ, as the trace says
    int64_t mMet = 0;                      // in the present stretch
    bool mHasMetAny = false;
    bool mBoots = false;  // the last record was of a boot
    std::optional<base::Failure> mFailure;
};

}  // namespace report
