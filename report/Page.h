#pragma once

#include <optional>
#include <string>

#include "report/Journal.h"
#include "report/Report.h"
#include "trace/Failure.h"

namespace report {

/**
 * The summary as one HTML file with a picture of each day. It needs no network and runs no script;
 * what comes from outside is text in it and never markup.
 */
class Page : public Report {
public:
    /** Writes the file `path`, which is made anew; of one input only. */
    explicit Page(std::string path) : mPath(std::move(path)) {}

    bool wantsCalls() const override { return true; }
    void begin(const Input& input) override { mJournal.begin(input); }
    void take(const Record& record) override { mJournal.take(record); }
    void end(bool isWhole) override;
    const std::optional<trace::Failure>& failure() const override { return mFailure; }

private:
    std::string html(bool isWhole) const;
    std::string dayHtml(const Day& day) const;
    std::string eventHtml(const Event& event) const;
    std::string reasonsHtml() const;

    const std::string mPath;
    Journal mJournal;
    std::optional<trace::Failure> mFailure;
};

}  // namespace report
