#include "day/Coverage.h"

#include <algorithm>

#include "base/Calendar.h"

namespace day {

std::vector<Span> seenOf(const Journal& journal, size_t capture) {
    const Notes& notes = journal.captures()[capture];
    const auto boot = std::find_if(journal.boots().begin(), journal.boots().end(),
                                   [capture](const Boot& each) { return each.capture == capture; });
    std::vector<Span> seen;
    Span rest{boot->span.from, *notes.knownTo()};
    for (const Span& gap : spansOf(notes.gaps())) {
        if (gap.from > rest.from) seen.push_back({rest.from, std::min(gap.from, rest.to)});
        rest.from = std::max(rest.from, gap.to);
        if (rest.from >= rest.to) return seen;
    }
    if (rest.from < rest.to) seen.push_back(rest);
    return seen;
}

std::vector<Span> commonOf(const std::vector<Span>& a, const std::vector<Span>& b) {
    std::vector<Span> common;
    for (auto inA = a.begin(), inB = b.begin(); inA != a.end() && inB != b.end();) {
        const Span span{std::max(inA->from, inB->from), std::min(inA->to, inB->to)};
        if (span.from < span.to) common.push_back(span);
        if (inA->to < inB->to) {
            ++inA;
        } else {
            ++inB;
        }
    }
    return common;
}

int64_t lengthOf(const std::vector<Span>& spans) {
    int64_t length = 0;
    for (const Span& span : spans) length += span.to - span.from;
    return length;
}

BatteryCoverage batteryCoverage(const Journal& journal, size_t capture) {
    const std::vector<Span> seen = seenOf(journal, capture);
    std::vector<Span> known;
    std::vector<Span> plugged;
    if (const auto& states = journal.captures()[capture].known()) known = spansOf(states->charge);
    for (const StateSpan& state : journal.charge()) {
        const bool isPlugged = state.value >= 1 && state.value <= 3;
        if (journal.isOf(state.boot, capture) && isPlugged) plugged.push_back(state.span);
    }
    const std::vector<Span> seenKnown = commonOf(seen, known);
    BatteryCoverage coverage;
    coverage.seen = lengthOf(seen) - lengthOf(commonOf(seenKnown, plugged));
    coverage.isUpperBound = lengthOf(seenKnown) < lengthOf(seen);
    const auto& charge = journal.captures()[capture].taken()->sinceCharge;
    if (charge->onBatteryMs) {
        coverage.seen = std::min(coverage.seen, *charge->onBatteryMs * base::kNsPerMs);
    }
    return coverage;
}

}  // namespace day
