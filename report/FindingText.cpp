#include "report/FindingText.h"

#include "report/CaptureFacts.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Text.h"

namespace report {

namespace {

using day::Finding;

std::string times(int64_t number) {
    return number == 1 ? "once" : std::to_string(number) + " times";
}

std::string describe(const Finding& finding, const day::Journal& journal) {
    const auto moment = [&](int64_t at) {
        return finding.capture ? formatMoment(at, journal.captures[*finding.capture])
                               : formatClock(at);
    };
    const std::string app = nameApp(finding.holder);
    const std::string sensor = nameSensor(finding.holder);
    switch (finding.kind) {
        case Finding::Kind::kLost:
            return "The record has lost lines " + times(finding.count) + ", first from " +
                   moment(finding.from) + " to " + moment(finding.to) + " (" + finding.text +
                   "): what happened there is not known.";
        case Finding::Kind::kDark:
            return app + " held " + sensor + " for " + formatDuration(finding.time) +
                   " with the display off.";
        case Finding::Kind::kUnbatched:
            return app + " held " + sensor + ", which wakes the phone, for " +
                   formatDuration(finding.time) + " with the display off and without batching.";
        case Finding::Kind::kThrough:
            return app + " had " + sensor + " on all through, since before " +
                   moment(finding.from) + ": for at least " + formatDuration(finding.time) + '.';
        case Finding::Kind::kDied:
            return app + " went without switching " + sensor + " off, " + times(finding.count) +
                   ": it was on for " + formatDuration(finding.time) + " at most.";
        case Finding::Kind::kRefused:
            return "The device refused " + app + " to switch " + sensor + " on, " +
                   times(finding.count) + ": " + finding.text + '.';
        case Finding::Kind::kNoAccess:
            return app + " has " + sensor + " on without access: it gets no data.";
        case Finding::Kind::kUnseen:
            return "Only " + formatDuration(finding.time) + " is seen of the " +
                   formatDuration(finding.to - finding.from) + " from " + moment(finding.from) +
                   " to " + moment(finding.to) + ": of the rest nothing is told.";
    }
    return {};
}

}  // namespace

bool hasFindings(const day::Journal& journal) {
    return !journal.captures.empty() || !journal.lost.empty();
}

std::vector<std::string> describeFindings(const day::Journal& journal) {
    std::vector<std::string> sentences;
    for (const Finding& finding : findFindings(journal)) {
        sentences.push_back(safe(describe(finding, journal)));
    }
    if (sentences.empty()) sentences.emplace_back("Nothing stands out.");
    return sentences;
}

}  // namespace report
