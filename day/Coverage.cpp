#include "day/Coverage.h"

#include <algorithm>

namespace day {

std::vector<Span> seenOf(const Journal& journal, size_t capture) {
    std::vector<Span> seen;
    for (const Boot& boot : journal.boots()) {
        if (boot.capture == capture) seen.insert(seen.end(), boot.seen.begin(), boot.seen.end());
    }
    return seen;
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
        coverage.seen = std::min(coverage.seen, toClock(*charge->onBatteryMs));
    }
    return coverage;
}

}  // namespace day
