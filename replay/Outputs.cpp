#include "replay/Outputs.h"

#include <cstdio>
#include <string>
#include <utility>

#include "report/Check.h"
#include "report/Compare.h"
#include "report/Csv.h"
#include "report/Lines.h"
#include "report/Page.h"
#include "report/Summary.h"
#include "report/TimelineFile.h"

namespace replay {

using base::OutputFile;
using trace::Record;

const std::vector<FileOutput>& fileOutputs() {
    using Made = std::unique_ptr<report::Report>;
    static const std::vector<FileOutput> outputs{
            {"--timeline", "write the days as trace events to FILE, for a timeline viewer",
             [](OutputFile* file, const Options& options) -> Made {
                 return std::make_unique<report::TimelineFile>(file, options.inputs() > 1);
             }},
            {"--page", "write the summary as an HTML page to FILE",
             [](OutputFile* file, const Options& options) -> Made {
                 return std::make_unique<report::Page>(file, options.baseline.size());
             }},
            {"--uses", "write a row for each use of a sensor to FILE, as CSV",
             [](OutputFile* file, const Options&) -> Made {
                 return std::make_unique<report::UsesCsv>(file);
             }},
            {"--since-charge", "write the battery statistics of bug reports to FILE, as CSV",
             [](OutputFile* file, const Options&) -> Made {
                 return std::make_unique<report::SinceChargeCsv>(file);
             }},
    };
    return outputs;
}

Outputs::Outputs(const Options& options, Progress* progress) : mProgress(progress) {
    const report::Looks looks{options.all, options.colours, options.columns};
    const size_t baselines = options.baseline.size();
    if (options.check) {
        add(std::make_unique<report::Check>(&mOut));
    } else if (baselines > 0 && options.json) {
        add(std::make_unique<report::CompareLines>(&mOut, baselines));
    } else if (baselines > 0) {
        add(std::make_unique<report::CompareSummary>(&mOut, baselines, looks));
    } else if (options.json) {
        add(std::make_unique<report::JsonLines>(&mOut, options.inputs() > 1));
    } else if (options.log) {
        add(std::make_unique<report::LogLines>(&mOut));
    } else {
        add(std::make_unique<report::Summary>(&mOut, looks));
    }
}

base::Result<void> Outputs::open(const Options& options) {
    for (const auto& [output, path] : options.outputs) {
        auto file = base::OutputFile::create(path);
        if (!file) return tl::unexpected(file.error());
        mFiles.push_back(std::move(*file));
        add(output->make(&mFiles.back(), options));
    }
    return {};
}

void Outputs::take(const Record& record) {
    switch (record.kind) {
        case Record::Kind::kInput:
            for (const auto& report : mReports) report->begin(std::string(record.texts[0]));
            return;
        case Record::Kind::kWarning:
            mProgress->clear();
            std::fprintf(stderr, "%s\n", std::string(record.texts[0]).c_str());
            return;
        case Record::Kind::kFailure:
            mFailure = base::Failure{std::string(record.texts[0]), static_cast<int>(record.number)};
            return;
        case Record::Kind::kPlayed:
            endInput(record.number);
            return;
        default:
            for (const auto& report : mReports) report->take(record);
    }
}

void Outputs::endInput(int64_t tookNs) {
    mProgress->clear();
    for (const auto& report : mReports) {
        report->took(tookNs);
        report->end(!mFailure);
    }
    mOut.flush();
    for (const auto& report : mReports) {
        if (!mFailure) mFailure = report->failure();
    }
}

trace::WantedRecords Outputs::wanted() const {
    trace::WantedRecords wanted;
    for (const auto& report : mReports) {
        wanted.calls |= report->wanted().calls;
        wanted.counters |= report->wanted().counters;
    }
    return wanted;
}

base::Result<void> Outputs::finish() {
    for (const auto& report : mReports) {
        report->finish();
        if (report->failure()) return tl::unexpected(*report->failure());
    }
    mOut.flush();
    for (base::OutputFile& file : mFiles) {
        if (auto committed = file.commit(); !committed) return committed;
    }
    return {};
}

}  // namespace replay
