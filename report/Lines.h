#pragma once

#include <string>

#include "report/Report.h"
#include "report/Stdout.h"

namespace report {

/** What happened as JSON Lines, in the order in which it happened. */
class JsonLines : public Report {
public:
    /** `withFile`: each line ends with the input's name. */
    JsonLines(Stdout* out, bool withFile) : mOut(out), mWithFile(withFile) {}

    void begin(const Input& input) override;
    void take(const Record& record) override;

private:
    Stdout* const mOut;
    const bool mWithFile;
    std::string mEnd = "}\n";  // of each line
};

/** What happened as lines for a person, in the order in which it happened. */
class LogLines : public Report {
public:
    explicit LogLines(Stdout* out) : mOut(out) {}

    void take(const Record& record) override;

private:
    Stdout* const mOut;
};

}  // namespace report
