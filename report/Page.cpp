#include "report/Page.h"

#include <vector>

#include "base/Calendar.h"
#include "report/CaptureFacts.h"
#include "report/CauseText.h"
#include "report/ChargeText.h"
#include "report/EventText.h"
#include "report/FindingText.h"
#include "report/OnNowText.h"
#include "report/PageDay.h"
#include "report/Text.h"
#include "report/page/TableOf.h"

namespace report {

namespace {

page::Section sectionOf(const day::Event& event) {
    const EventText text = layOutEvent(event, Table::kAllRows);
    page::Section section;
    section.heading = text.title;
    page::Section::List values;
    for (const auto& [what, value] : text.values) values.items.push_back(what + ": " + value);
    if (!values.items.empty()) section.lists.push_back(values);
    for (const Table& list : text.lists) {
        section.tables.push_back(page::tableOf(list, "report", "What it lists"));
    }
    return section;
}

page::Section onNow(const day::Journal& journal, size_t capture) {
    const OnNowText text = describeOnNow(journal, capture, Table::kAllRows);
    page::Section section;
    section.heading = kOnNowHeading;
    section.lines = text.before;
    section.lines.insert(section.lines.end(), text.after.begin(), text.after.end());
    if (!text.rows.isEmpty())
        section.tables.push_back(page::tableOf(text.rows, "on", "What is on"));
    return section;
}

page::Section sinceCharge(const day::Journal& journal, size_t capture) {
    const ChargeText text = describeSinceCharge(journal, capture, Table::kAllRows);
    page::Section section;
    section.heading = kChargeHeading;
    section.lines.push_back(text.line);
    if (!text.rows.isEmpty()) {
        section.tables.push_back(page::tableOf(text.rows, "charge", "Held on battery"));
    }
    return section;
}

/** The events, day by day, that lie ahead of the capture, or those that do not. */
page::Section reports(const day::Journal& journal, bool isAhead) {
    page::Section section;
    section.heading = isAhead ? "Would report, if nothing changed" : "The device reports";
    if (isAhead) section.lines = describeBounds(journal);
    for (const day::Day& day : journal.days()) {
        page::Section part;
        part.heading = nameDay(journal, day);
        for (const day::Event* event : journal.eventsOf(day)) {
            if (event->isAhead == isAhead) part.parts.push_back(sectionOf(*event));
        }
        if (!part.parts.empty()) section.parts.push_back(part);
    }
    if (section.parts.empty()) section.lines.emplace_back("Nothing.");
    return section;
}

page::Section comparisonSection(const ComparisonText& text) {
    page::Section section;
    section.heading = "Old against new";
    for (const std::string& line : text.coverage) section.lines.push_back(safe(line));
    for (const ComparedPart& part : text.parts) {
        if (!part.sentence.empty()) section.lines.push_back(part.sentence);
        if (part.table.isEmpty()) continue;
        page::Section& shown = section.parts.emplace_back();
        shown.heading = part.heading;
        shown.tables.push_back(page::tableOf(part.table, "compared", part.caption));
    }
    return section;
}

page::Section causes(const std::vector<CauseText>& texts) {
    page::Section section;
    section.heading = "Why times held and times reported differ";
    for (const auto& [text, names] : texts) {
        page::Section::List list{text + ":", {}};
        for (const std::string& name : names) list.items.push_back(safe(name));
        section.lists.push_back(list);
    }
    return section;
}

}  // namespace

void Page::end(bool isWhole) {
    mJournal.end();
    mSides.add(mJournal);
    mWriter.add(model(isWhole));
}

void Page::finish() {
    std::optional<page::Section> first;
    if (const auto text = mSides.layOut(Table::kAllRows)) first = comparisonSection(*text);
    if (!mWriter.finish(mFile->file(), first)) mFailure = mFile->failure();
}

page::Input Page::model(bool isWhole) const {
    page::Input input;
    input.name = safe(mJournal.name());
    input.lines = describeCaptures(mJournal);
    if (!isWhole) input.lines.emplace_back("The replay has stopped before the end.");
    if (hasFindings(mJournal)) input.findings = describeFindings(mJournal);
    const auto& captures = mJournal.captures();
    for (size_t i = 0; i < captures.size(); ++i) input.before.push_back(onNow(mJournal, i));
    for (const day::Day& day : mJournal.days()) input.days.push_back(pageDay(mJournal, day));
    for (size_t i = 0; i < captures.size(); ++i) {
        const auto& taken = captures[i].taken();
        if (taken && taken->sinceCharge) input.after.push_back(sinceCharge(mJournal, i));
    }
    input.after.push_back(reports(mJournal, false));
    page::Section ahead = reports(mJournal, true);
    if (!ahead.parts.empty()) input.after.push_back(std::move(ahead));
    const auto texts = describeCauses(mJournal.causes());
    if (!texts.empty()) input.after.push_back(causes(texts));
    if (!mJournal.properties().empty()) {
        page::Section stored;
        stored.heading = "Stored at the end";
        stored.tables.push_back(
                page::tableOf(propertyTable(mJournal.properties()), "stored", "Properties"));
        input.after.push_back(stored);
    }
    input.end = "Played " + count(mJournal.boots().size(), "boot") + ", " +
                base::formatDuration(std::chrono::nanoseconds(mJournal.played())) +
                " of the device's time.";
    return input;
}

}  // namespace report
