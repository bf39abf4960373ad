#pragma once

#include <optional>
#include <string>
#include <vector>

#include "report/Record.h"
#include "trace/Failure.h"
#include "trace/Origin.h"

namespace report {

/** What is about to be played. */
struct Input {
    std::string name;                        // of the file, as it was given
    const trace::Origin* origin = nullptr;   // of a capture's trace
    std::vector<std::string> warnings = {};  // of its import, a line each
};

/**
 * Something that is made of a replay: lines, a summary, a picture. For each input it hears of the
 * begin, of all that happens in order, and of the end, all on one thread.
 */
class Report {
public:
    virtual ~Report() = default;

    /** Whether it reads records of calls (`kCall`), which are only made if somebody does. */
    virtual bool wantsCalls() const { return false; }

    virtual void begin(const Input&) {}
    virtual void take(const Record& record) = 0;

    /** After the last record; `isWhole` tells whether the input was played to its end. */
    virtual void end([[maybe_unused]] bool isWhole) {}

    /** What the report has found wrong, or why it could not be made, if anything. */
    virtual const std::optional<trace::Failure>& failure() const {
        static const std::optional<trace::Failure> kNone;
        return kNone;
    }
};

}  // namespace report
