#include "day/DayTable.h"

#include <algorithm>
#include <limits>

#include "base/Calendar.h"
#include "day/Samples.h"

namespace day {

namespace {

bool costsMore(const DayRow& a, const DayRow& b) {
    constexpr double kUnknown = std::numeric_limits<double>::infinity();
    const bool isContinuousA = isContinuous(a.holder);
    if (isContinuousA != isContinuous(b.holder)) return isContinuousA;
    const double samplesA = a.samples.value_or(kUnknown);
    const double samplesB = b.samples.value_or(kUnknown);
    return samplesA != samplesB ? samplesA > samplesB : a.held > b.held;
}

}  // namespace

void DayTable::add(const Use& use, const UseTracker& tracker) {
    for (int64_t number = use.from / base::kNsPerDay;; ++number) {
        const int64_t midnight = (number + 1) * base::kNsPerDay;
        const bool isFirst = number == use.from / base::kNsPerDay;
        const bool isLast = use.to <= midnight;
        const Span span{std::max(use.from, midnight - base::kNsPerDay), std::min(use.to, midnight)};
        const auto [found, isNew] = mRows[{use.boot, number}].try_emplace(keyOf(use));
        DayRow& row = found->second;
        row.holder = use;
        const auto samples = samplesOf(use, span.to - span.from);
        if (isNew) {
            row.samples = samples;
        } else {
            row.samples =
                    row.samples && samples ? std::optional(*row.samples + *samples) : std::nullopt;
        }
        const auto enables = std::count_if(
                use.enables.begin(), use.enables.end(),
                [number](const Enable& enable) { return enable.at / base::kNsPerDay == number; });
        row.add({span.to - span.from, tracker.displayIn(span), enables, use.periodNs, use.batchUs});
        row.isBefore = row.isBefore || (use.before && isFirst);
        row.isUnseen = row.isUnseen || use.end == End::kUnseen;
        row.state = use.end == End::kOn || !isLast ? DayRow::State::kOn
                    : use.end == End::kFired       ? DayRow::State::kFired
                                                   : DayRow::State::kOff;
        if (isLast) return;
    }
}

std::vector<Day> DayTable::days() const {
    std::vector<Day> days;
    for (const auto& [day, rows] : mRows) days.push_back(day);
    return days;
}

std::vector<DayRow> DayTable::rowsOf(const Day& day) const {
    std::vector<DayRow> rows;
    const auto found = mRows.find(day);
    if (found == mRows.end()) return rows;
    for (const auto& [key, row] : found->second) rows.push_back(row);
    std::stable_sort(rows.begin(), rows.end(), costsMore);
    return rows;
}

}  // namespace day
