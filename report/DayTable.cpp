#include "report/DayTable.h"

#include <algorithm>

#include "report/SensorNames.h"
#include "report/Text.h"

namespace report {

void DayTable::add(int64_t boot, const Slice& slice, const Usage& usage) {
    for (int64_t number = slice.from / kNsPerDay;; ++number) {
        const int64_t midnight = (number + 1) * kNsPerDay;
        const Span span{std::max(slice.from, midnight - kNsPerDay), std::min(slice.to, midnight)};
        DayUse& use = mUses[{boot, number}][{slice.app, slice.type}];
        use.app = slice.app;
        use.type = slice.type;
        use.held += span.to - span.from;
        const DisplayTime display = usage.displayIn(span);
        use.display.known += display.known;
        use.display.on += display.on;
        for (const Enable& enable : slice.enables) {
            if (enable.at / kNsPerDay != number) continue;
            ++use.enables;
            use.fastest = std::min(use.fastest.value_or(enable.periodNs), enable.periodNs);
        }
        use.isOpen = slice.isOpen || slice.to > midnight;
        if (slice.to <= midnight) return;
    }
}

std::vector<Day> DayTable::days() const {
    std::vector<Day> days;
    for (const auto& [day, uses] : mUses) days.push_back(day);
    return days;
}

std::vector<DayUse> DayTable::usesOf(const Day& day) const {
    std::vector<DayUse> uses;
    const auto found = mUses.find(day);
    if (found == mUses.end()) return uses;
    for (const auto& [key, use] : found->second) uses.push_back(use);
    std::stable_sort(uses.begin(), uses.end(),
                     [](const DayUse& a, const DayUse& b) { return a.held > b.held; });
    return uses;
}

Table layOut(const std::vector<DayUse>& uses, const trace::Origin* origin, size_t limit) {
    Table table({{"App", Table::Column::kCut},
                 {"Sensor", Table::Column::kCut},
                 {"Held", Table::Column::kRight},
                 {"Display", Table::Column::kRight},
                 {"Enables", Table::Column::kRight},
                 {"Hz", Table::Column::kRight},
                 {""}},
                limit);
    for (const DayUse& use : uses) {
        table.add({use.app, nameSensor(use.type, origin), formatDuration(use.held),
                   formatShare(use.display), std::to_string(use.enables),
                   use.fastest ? formatRate(*use.fastest) : "-", use.isOpen ? "still on" : ""});
    }
    return table;
}

}  // namespace report
