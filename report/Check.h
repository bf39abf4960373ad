#pragma once

#include <cstdint>
#include <deque>
#include <optional>
#include <string>

#include "report/Report.h"
#include "report/Stdout.h"
#include "trace/Failure.h"

namespace report {

/**
 * Compares the events and properties of a replay with the "expect" lines of its trace, in order and
 * without regard to their times.
 */
class Check : public Report {
public:
    explicit Check(Stdout* out) : mOut(out) {}

    void begin(const Input& input) override;
    void take(const Record& record) override;

    /** Says on standard output how many expectations the replay has met, if it has met all. */
    void end(bool isWhole) override;

    /** The first difference, or that there was nothing to compare with. */
    const std::optional<trace::Failure>& failure() const override { return mFailure; }

private:
    struct Entry {
        std::string text;
        int64_t at;    // nanoseconds
        int64_t line;  // of an expectation
    };

    void compare();
    void differ(const Entry* expected, const Entry* given);

    Stdout* const mOut;
    std::string mName;
    std::deque<Entry> mExpected;  // not compared yet; either queue is empty
    std::deque<Entry> mGiven;
    int64_t mMet = 0;
    std::optional<trace::Failure> mFailure;
};

}  // namespace report
