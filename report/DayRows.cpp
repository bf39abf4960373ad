#include "report/DayRows.h"

#include <cmath>
#include <cstdio>

#include "day/Samples.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Text.h"

namespace report {

namespace {

using State = day::DayRow::State;

constexpr double kUsPerSecond = 1e6;

/** `number` with at most one decimal. */
std::string decimal(double number) {
    char text[48];
    std::snprintf(text, sizeof(text), "%.1f", number);
    std::string result = text;
    const size_t point = result.size() - 2;
    return result.compare(point, 2, ".0") == 0 ? result.substr(0, point) : result;
}

const char* describe(State state) {
    return state == State::kOn ? "still on" : state == State::kFired ? "fired" : "";
}

}  // namespace

Table dayTable(const std::vector<day::DayRow>& rows, size_t limit) {
    Table table({{"App", Table::Column::kCut},
                 {"Sensor", Table::Column::kCut},
                 {"Held", Table::Column::kRight},
                 {"Display", Table::Column::kRight},
                 {"Enables", Table::Column::kRight},
                 {"Hz", Table::Column::kRight},
                 {"Batch", Table::Column::kRight},
                 {"Wake"},
                 {"Samples", Table::Column::kRight},
                 {""}},
                limit);
    for (const day::DayRow& row : rows) {
        table.add({nameApp(row.holder), nameSensor(row.holder), formatHeld(row),
                   formatDisplay(row.display), std::to_string(row.enables),
                   formatHz(row.holder, row.periodNs), formatBatch(row.batchUs),
                   formatWake(row.holder), formatSamples(row.samples), describe(row.state)});
    }
    return table;
}

std::string formatHeld(const day::DayRow& row) {
    const char* mark = row.isBefore ? (row.isUnseen ? "~" : "≥") : row.isUnseen ? "≤" : "";
    return mark + formatDuration(row.held);
}

std::string formatDisplay(const day::DisplayTime& time) {
    if (time.known == 0) return "–";
    return formatDuration(time.on) + " of " + formatDuration(time.known);
}

std::string formatHz(const day::Holder& holder, std::optional<int64_t> periodNs) {
    if (holder.mode == trace::SensorMode::kOneShot) return {};
    if (!periodNs) return "?";
    const auto rate = rateOf(holder, periodNs);
    return rate ? formatHertz(*rate) : formatRate(*periodNs);
}

std::string formatBatch(std::optional<int64_t> us) {
    if (!us) return {};
    if (*us == day::kAsLongAsPossible) return "as long as possible";
    const auto number = static_cast<double>(*us);
    if (*us == 0) return "0";
    return number >= kUsPerSecond ? decimal(number / kUsPerSecond) + " s"
                                  : decimal(number / 1000) + " ms";
}

std::string formatWake(const day::Holder& holder) {
    return holder.wakeUp == true ? "wake" : "";
}

std::string formatSamples(std::optional<double> samples) {
    if (!samples) return {};
    char text[48];
    const bool isSmall = *samples < 9999.5;
    const bool isMiddle = *samples < 999'950;
    // Halves go up, as the page's script has it.
    std::snprintf(text, sizeof(text),
                  isSmall    ? "%.0f"
                  : isMiddle ? "%.1fk"
                             : "%.1fM",
                  isSmall    ? std::round(*samples)
                  : isMiddle ? std::round(*samples / 1e2) / 10
                             : std::round(*samples / 1e5) / 10);
    return text;
}

}  // namespace report
