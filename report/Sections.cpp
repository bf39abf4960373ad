#include "report/Sections.h"

#include <optional>

#include "base/Calendar.h"
#include "report/CaptureFacts.h"
#include "report/EventText.h"

namespace report {

namespace {

/** The events, day by day, that lie ahead of what is known, or those that do not. */
Section layOutReports(const day::Journal& journal, bool isAhead, size_t limit) {
    Section section;
    section.heading = isAhead ? "Would report, if nothing changed" : "The device reports";
    if (isAhead) section.lines = describeBounds(journal);
    std::optional<day::Day> last;
    for (const day::Event& event : journal.events) {
        if (event.isAhead != isAhead) continue;
        const day::Day day{event.boot, event.at / base::kNsPerDay};
        if (!last || *last < day) section.parts.emplace_back().heading = nameDay(journal, day);
        last = day;
        section.parts.back().parts.push_back(layOutEvent(event, limit));
    }
    return section;
}

}  // namespace

std::vector<Section> sectionsBefore(const day::Journal& journal, size_t limit) {
    std::vector<Section> sections;
    for (size_t i = 0; i < journal.captures.size(); ++i) {
        sections.push_back(layOutOnNow(journal, i, limit));
    }
    return sections;
}

std::vector<Section> sectionsAfter(const day::Journal& journal, size_t limit) {
    std::vector<Section> sections;
    for (size_t i = 0; i < journal.captures.size(); ++i) {
        const auto& taken = journal.captures[i].taken;
        if (taken && taken->sinceCharge) sections.push_back(layOutSinceCharge(journal, i, limit));
    }
    sections.push_back(layOutReports(journal, false, limit));
    Section ahead = layOutReports(journal, true, limit);
    if (!ahead.parts.empty()) sections.push_back(std::move(ahead));
    Section causes = layOutCauses(journal.causes());
    if (!causes.isEmpty()) sections.push_back(std::move(causes));
    if (!journal.properties.empty()) {
        Section& stored = sections.emplace_back();
        stored.heading = "Stored at the end";
        stored.add(propertyTable(journal.properties), "stored", "Properties");
    }
    return sections;
}

}  // namespace report
