#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "base/Result.h"
#include "trace/Record.h"

namespace report {

/**
 * Something that is made of a replay: lines, a summary, a picture. For each input it hears of the
 * begin, of all that happens in order, and of the end, all on one thread.
 */
class Report {
public:
    virtual ~Report() = default;

    /** The records that it reads, of those that are only made if somebody does. */
    virtual trace::WantedRecords wanted() const { return {}; }

    /** An input is about to be played; `name` is the file's, as it was given. */
    virtual void begin([[maybe_unused]] const std::string& name) {}
    virtual void take(const trace::Record& record) = 0;

    /** After the last record: the real time that the input took, ns. */
    virtual void took([[maybe_unused]] int64_t ns) {}

    /** After that; `isWhole` tells whether the input was played to its end. */
    virtual void end([[maybe_unused]] bool isWhole) {}

    /** After the last input. */
    virtual void finish() {}

    /** What the report has found wrong, or why it could not be made, if anything. */
    virtual const std::optional<base::Failure>& failure() const {
        static const std::optional<base::Failure> kNone;
        return kNone;
    }
};

}  // namespace report
