#include <optional>

#include "base/Calendar.h"
#include "day/OnNow.h"
#include "report/CaptureFacts.h"
#include "report/DayRows.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Sections.h"
#include "report/Text.h"

namespace report {

namespace {

/** Since when a sensor is on: "14:51:32", with the day if that is not the capture's. */
std::string formatSince(const day::Use& use, const day::Notes& notes) {
    const int64_t takenDay = *notes.knownTo() / base::kNsPerDay;
    const int64_t day = use.from / base::kNsPerDay;
    const std::string time = formatTimeOfDay(use.from);
    return (use.before ? "before " : "") + (day == takenDay ? time : formatMoment(use.from, notes));
}

std::string describeRow(const day::OnRow& row) {
    std::vector<std::string> texts;
    if (!row.hasAccess) texts.emplace_back("no data access");
    if (row.wakeLocks > 0) texts.push_back(count(static_cast<size_t>(row.wakeLocks), "wake lock"));
    if (row.connections > 1) texts.push_back(std::to_string(row.connections) + " connections");
    if (row.use != nullptr && !row.use->periodNs) texts.emplace_back("rate unknown");
    if (row.use == nullptr) texts.emplace_back("no line tells of it");
    return join(texts);
}

std::string nameRate(int64_t level) {
    constexpr const char* kNames[] = {"stopped", "normal", "fast", "very fast"};
    const bool isKnown = level >= 0 && level <= 3;
    return std::to_string(level) + (isKnown ? std::string(" (") + kNames[level] + ")" : "");
}

std::string describeChannel(const trace::DirectChannel& channel, const day::Notes& notes) {
    const bool isOfUid = channel.package.empty() && channel.uid;
    const std::string app =
            isOfUid ? nameUid(*channel.uid, notes.packagesOf(*channel.uid)) : channel.package;
    std::string text = "Direct channel of " + app + ": " +
                       count(static_cast<size_t>(channel.sensors), "sensor");
    std::vector<std::string> rates;
    for (const int64_t rate : channel.rates) rates.push_back(nameRate(rate));
    if (!rates.empty()) text += rates.size() == 1 ? ", rate level " : ", rate levels ";
    return safe(text + join(rates));
}

}  // namespace

Section layOutOnNow(const day::Journal& journal, size_t capture, size_t limit) {
    const day::Notes& notes = journal.captures[capture];
    const day::OnNow on = whatIsOn(journal, capture);
    Table table({{"App", Table::Column::kCut},
                 {"Sensor", Table::Column::kCut},
                 {"Since"},
                 {"Hz", Table::Column::kRight},
                 {"Batch", Table::Column::kRight},
                 {"Wake"},
                 {""}},
                limit);
    for (const day::OnRow& row : on.rows) {
        const day::Use* const use = row.use;
        table.add({nameApp(row.holder), nameSensor(row.holder),
                   use != nullptr ? formatSince(*use, notes) : "",
                   use != nullptr ? formatHz(row.holder, use->periodNs) : "",
                   use != nullptr ? formatBatch(use->batchUs) : "", formatWake(row.holder),
                   describeRow(row)});
    }
    Section section;
    section.heading = "On when it was taken";
    if (on.rows.empty()) section.lines.emplace_back("Nothing is on.");
    if (!on.isFromConnections) {
        section.lines.emplace_back(
                "The capture has no table of connections: the registrations tell it.");
    }
    section.add(std::move(table), "on", "What is on");
    if (!notes.taken) return section;
    if (notes.taken->operatingMode) {
        section.below.push_back("Operating mode: " + safe(*notes.taken->operatingMode));
    }
    for (const trace::DirectChannel& each : notes.taken->direct) {
        section.below.push_back(describeChannel(each, notes));
    }
    return section;
}

}  // namespace report
