#include "day/Findings.h"

#include <algorithm>
#include <map>
#include <tuple>

#include "day/Samples.h"

namespace day {

namespace {

using Kind = Finding::Kind;

/** What a client did with a sensor, over all its uses. */
struct Sum {
    Holder holder;
    int64_t dark = 0;       // with the display off
    int64_t unbatched = 0;  // of that
    int64_t through = 0;
    int64_t throughFrom = 0;
    std::optional<size_t> capture = {};  // of `throughFrom`
    int64_t died = 0;                    // times
    int64_t heldByDead = 0;
};

/** Whether `use` ended in a gap of what is seen, where its disable may have been. */
bool endsInGap(const Use& use, const Journal& journal) {
    const auto capture = journal.bootOf(use).capture;
    if (!capture) return false;
    const std::vector<Span> gaps = spansOf(journal.captures[*capture].gaps);
    return std::any_of(gaps.begin(), gaps.end(), [&](const Span& gap) { return use.to == gap.to; });
}

std::map<HolderKey, Sum> sumUp(const Journal& journal) {
    std::map<HolderKey, Sum> sums;
    for (const Use& use : journal.uses) {
        Sum& sum = sums[keyOf(use)];
        sum.holder = use;
        const int64_t dark = use.display.off();
        const bool isOneShot = use.mode == trace::SensorMode::kOneShot;
        if (isContinuous(use)) sum.dark += dark;
        if (use.wakeUp == true && !isOneShot && use.batchUs == 0) sum.unbatched += dark;
        if (use.before && use.end == End::kOn) {
            sum.through = use.to - use.from;
            sum.throughFrom = use.from;
            sum.capture = journal.bootOf(use).capture;
        }
        // A one-shot sensor whose firing is not in the recent events ends like this, too.
        if (use.end == End::kUnseen && !isOneShot && !endsInGap(use, journal)) {
            ++sum.died;
            sum.heldByDead += use.to - use.from;
        }
    }
    return sums;
}

void addLost(const Journal& journal, std::vector<Finding>* findings) {
    const auto& lost = journal.lost;
    if (lost.empty()) return;
    findings->push_back({Kind::kLost,
                         {},
                         0,
                         static_cast<int64_t>(lost.size()),
                         lost[0].from * base::kNsPerMs,
                         lost[0].to * base::kNsPerMs,
                         lost[0].why});
}

void addUses(const Journal& journal, std::vector<Finding>* findings) {
    for (const auto& [key, sum] : sumUp(journal)) {
        if (sum.dark >= kLongDark) findings->push_back({Kind::kDark, sum.holder, sum.dark});
        if (sum.unbatched >= kLongUnbatched) {
            findings->push_back({Kind::kUnbatched, sum.holder, sum.unbatched});
        }
        if (sum.through >= kLongThrough) {
            findings->push_back({Kind::kThrough,
                                 sum.holder,
                                 sum.through,
                                 0,
                                 sum.throughFrom,
                                 0,
                                 {},
                                 sum.capture});
        }
        if (sum.died > 0) {
            findings->push_back({Kind::kDied, sum.holder, sum.heldByDead, sum.died});
        }
    }
}

void addTaken(const Notes& notes, std::vector<Finding>* findings) {
    if (!notes.taken) return;
    const auto add = [&](Kind kind, const trace::Client& client, int64_t count,
                         const std::string& text) {
        findings->push_back({kind, notes.holderOf(client), count, count, 0, 0, text});
    };
    for (const trace::RefusedNote& each : notes.taken->refused) {
        add(Kind::kRefused, each.client, each.count, each.result);
    }
    if (!notes.taken->connections) return;
    for (const trace::Connection& each : *notes.taken->connections) {
        if (each.hasAccess == false) add(Kind::kNoAccess, each.client, each.count, "");
    }
}

void addUnseen(const Journal& journal, size_t capture, std::vector<Finding>* findings) {
    const std::vector<Span> seen = journal.seenOf(capture);
    if (seen.empty()) return;
    const int64_t from = seen[0].from / base::kNsPerDay * base::kNsPerDay;
    const int64_t to = *journal.captures[capture].knownTo();
    const int64_t length = lengthOf(seen);
    if (length / kSeenPercent >= (to - from) / 100) return;
    findings->push_back({Kind::kUnseen, {}, length, 0, from, to, {}, capture});
}

}  // namespace

std::vector<Finding> findFindings(const Journal& journal) {
    std::vector<Finding> findings;
    addLost(journal, &findings);
    addUses(journal, &findings);
    for (size_t i = 0; i < journal.captures.size(); ++i) {
        addTaken(journal.captures[i], &findings);
        addUnseen(journal, i, &findings);
    }
    std::stable_sort(findings.begin(), findings.end(), [](const Finding& a, const Finding& b) {
        return a.kind != b.kind ? a.kind < b.kind : a.time > b.time;
    });
    while (findings.size() > kMostFindings) {
        const auto last = findings.end() - 1;
        findings.erase(last->kind == Kind::kUnseen ? last - 1 : last);
    }
    return findings;
}

}  // namespace day
