#include <algorithm>
#include <cmath>
#include <vector>

#include "base/Calendar.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Sections.h"

namespace report {

namespace {

std::string formatPercent(std::optional<int64_t> part, std::optional<int64_t> whole) {
    if (!part || !whole || *whole <= 0) return {};
    const double percent = static_cast<double>(*part) * 100 / static_cast<double>(*whole);
    return std::to_string(std::lround(percent)) + " %";
}

std::string nameSensorOf(const trace::ChargeRow& row, const day::Notes& notes) {
    if (const auto* sensor = notes.sensorOf(row)) return nameSensor(sensor->type, sensor->name);
    const std::string name = notes.nameOf(row);
    return name.empty() ? "handle " + std::to_string(row.handle) : name;
}

std::string describeRow(const trace::ChargeRow& row) {
    std::vector<std::string> texts;
    if (row.shared) texts.emplace_back("shared");
    if (row.count == 0) texts.emplace_back("on since before the last charge");
    return join(texts);
}

std::string describeCoverage(const day::Journal& journal, size_t capture) {
    const auto& charge = *journal.captures[capture].taken->sinceCharge;
    const day::BatteryCoverage coverage = journal.batteryCoverage(capture);
    std::string text = std::string("The registrations cover ") +
                       (coverage.isUpperBound ? "at most " : "") + formatDuration(coverage.seen);
    if (!charge.onBatteryMs) return text + " of the time on battery.";
    return text + " of the " +
           base::formatDuration(std::chrono::milliseconds(*charge.onBatteryMs)) + " on battery.";
}

}  // namespace

Section layOutSinceCharge(const day::Journal& journal, size_t capture, size_t limit) {
    const day::Notes& notes = journal.captures[capture];
    const trace::SinceCharge& charge = *notes.taken->sinceCharge;
    std::vector<const trace::ChargeRow*> rows;
    for (const trace::ChargeRow& row : charge.rows) rows.push_back(&row);
    std::stable_sort(rows.begin(), rows.end(),
                     [](const auto* a, const auto* b) { return a->ms > b->ms; });
    Table table({{"App", Table::Column::kCut},
                 {"Sensor", Table::Column::kCut},
                 {"Time", Table::Column::kRight},
                 {"Of battery time", Table::Column::kRight},
                 {"In background", Table::Column::kRight},
                 {"Count", Table::Column::kRight},
                 {""}},
                limit);
    for (const trace::ChargeRow* row : rows) {
        table.add({nameUid(row->uid, notes.packagesOf(row->uid)), nameSensorOf(*row, notes),
                   base::formatDuration(std::chrono::milliseconds(row->ms)),
                   formatPercent(row->ms, charge.onBatteryMs),
                   formatPercent(row->background, row->ms), std::to_string(row->count),
                   describeRow(*row)});
    }
    Section section;
    section.heading = "Since the last charge";
    section.lines = {describeCoverage(journal, capture)};
    section.add(std::move(table), "charge", "Held on battery");
    return section;
}

}  // namespace report
