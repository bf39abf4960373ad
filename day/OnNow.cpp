#include "day/OnNow.h"

#include <algorithm>
#include <limits>
#include <tuple>

#include "day/Samples.h"

namespace day {

namespace {

/** The use of `client` among `uses`; one whose uid is not known if there is none of its uid. */
const Use* useOf(const trace::Client& client, const std::vector<const Use*>& uses) {
    const Use* found = nullptr;
    for (const Use* use : uses) {
        if (use->handle != client.handle || use->pkg != client.pkg) continue;
        if (use->uid == client.uid) return use;
        if (!use->uid || !client.uid) found = use;
    }
    return found;
}

/** By which `OnNow` is ordered, ascending. */
std::tuple<bool, double, int64_t> orderOf(const OnRow& row) {
    constexpr double kUnknown = std::numeric_limits<double>::infinity();
    const int64_t since = row.use != nullptr ? row.use->from : std::numeric_limits<int64_t>::max();
    if (!isContinuous(row.holder)) return {true, 0, since};
    const auto rate = row.use != nullptr ? rateOf(row.holder, row.use->periodNs) : std::nullopt;
    return {false, -rate.value_or(kUnknown), since};
}

}  // namespace

OnNow whatIsOn(const Journal& journal, size_t capture) {
    std::vector<const Use*> uses;
    for (const Use& use : journal.uses) {
        if (journal.isOf(use.boot, capture) && use.end == End::kOn) uses.push_back(&use);
    }
    OnNow on;
    const auto& taken = journal.captures[capture].taken;
    on.isFromConnections = taken && taken->connections;
    if (on.isFromConnections) {
        for (const trace::Connection& each : *taken->connections) {
            const Use* const use = useOf(each.client, uses);
            Holder holder = journal.captures[capture].holderOf(each.client);
            if (use != nullptr) holder = *use;
            on.rows.push_back({holder, use, each.count, each.hasAccess.value_or(true),
                               each.wakeLocks.value_or(0)});
        }
    } else {
        for (const Use* use : uses) on.rows.push_back({*use, use});
    }
    std::stable_sort(on.rows.begin(), on.rows.end(),
                     [](const OnRow& a, const OnRow& b) { return orderOf(a) < orderOf(b); });
    return on;
}

}  // namespace day
