#include "report/Summary.h"

#include <algorithm>
#include <cstdio>
#include <limits>

#include "base/Calendar.h"
#include "report/CaptureFacts.h"
#include "report/CauseText.h"
#include "report/ChargeText.h"
#include "report/DayRows.h"
#include "report/EventText.h"
#include "report/FindingText.h"
#include "report/OnNowText.h"
#include "report/Text.h"

namespace report {

void Summary::begin(const std::string& name) {
    mJournal.begin(name);
}

void Summary::end(bool isWhole) {
    if (!isWhole && mJournal.boots().empty()) return;
    mJournal.end();
    printCaptures();
    printFindings();
    for (size_t i = 0; i < mJournal.captures().size(); ++i) printOnNow(i);
    for (const day::Day& day : mJournal.table().days()) printDay(day);
    for (size_t i = 0; i < mJournal.captures().size(); ++i) printSinceCharge(i);
    printReports();
    printCauses();
    if (!mJournal.properties().empty()) {
        mTerminal.heading("Stored at the end");
        mTerminal.table(propertyTable(mJournal.properties()), 2);
    }
    printEnd(isWhole);
}

void Summary::printCaptures() {
    mTerminal.title(safe(mJournal.name()));
    for (const std::string& line : describeCaptures(mJournal)) mTerminal.sentence(line, 2);
}

void Summary::printFindings() {
    if (!hasFindings(mJournal)) return;
    mTerminal.heading("Findings");
    for (const std::string& sentence : describeFindings(mJournal)) {
        mTerminal.sentence("- " + sentence, 2);
    }
}

void Summary::printOnNow(size_t capture) {
    const OnNowText text = describeOnNow(mJournal, capture, mLimit);
    mTerminal.heading(kOnNowHeading);
    for (const std::string& line : text.before) mTerminal.sentence(line, 2);
    if (!text.rows.isEmpty()) mTerminal.table(text.rows, 2);
    for (const std::string& line : text.after) mTerminal.sentence(line, 2);
}

void Summary::printDay(const day::Day& day) {
    mTerminal.heading(nameDay(mJournal, day));
    mTerminal.table(dayTable(mJournal.table().rowsOf(day), mLimit), 2);
}

void Summary::printSinceCharge(size_t capture) {
    const auto& taken = mJournal.captures()[capture].taken();
    if (!taken || !taken->sinceCharge) return;
    const ChargeText text = describeSinceCharge(mJournal, capture, mLimit);
    mTerminal.heading(kChargeHeading);
    mTerminal.sentence(text.line, 2);
    if (!text.rows.isEmpty()) mTerminal.table(text.rows, 2);
}

void Summary::printReports() {
    std::vector<const day::Event*> known;
    std::vector<const day::Event*> ahead;
    for (const day::Event& event : mJournal.events()) {
        (event.isAhead ? ahead : known).push_back(&event);
    }
    if (known.empty()) {
        mTerminal.heading("The device reports nothing");
    } else {
        mTerminal.heading("The device reports");
        printEvents(known);
    }
    if (ahead.empty()) return;
    mTerminal.heading("Would report, if nothing changed");
    for (const std::string& line : describeBounds(mJournal)) mTerminal.sentence(line, 2);
    printEvents(ahead);
}

/** In order, each day's under its name. */
void Summary::printEvents(const std::vector<const day::Event*>& events) {
    std::optional<day::Day> last;
    for (const day::Event* event : events) {
        const day::Day day{event->boot, event->at / base::kNsPerDay};
        if (!last || *last < day) mTerminal.name(nameDay(mJournal, day), 2);
        last = day;
        printEvent(*event);
    }
}

void Summary::printEvent(const day::Event& event) {
    const EventText text = layOutEvent(event, mLimit);
    mTerminal.name(text.title, 4);
    for (const auto& [what, value] : text.values) mTerminal.name(what + ": " + value, 6);
    for (const Table& list : text.lists) mTerminal.table(list, 6);
}

void Summary::printCauses() {
    const auto causes = describeCauses(mJournal.causes());
    if (causes.empty()) return;
    mTerminal.heading("Why times held and times reported differ");
    for (const auto& [text, names] : causes) {
        mTerminal.sentence(text + ":", 2);
        const size_t shown = std::min(names.size(), mLimit);
        for (size_t i = 0; i < shown; ++i) mTerminal.name(safe(names[i]), 4);
        if (shown < names.size()) {
            mOut->write("    and " + std::to_string(names.size() - shown) + " more\n");
        }
    }
}

void Summary::printEnd(bool isWhole) {
    char seconds[32];
    std::snprintf(seconds, sizeof(seconds), "%.3f", static_cast<double>(mTook) / 1e9);
    mOut->write(std::string(isWhole ? "\nPlayed " : "\nStopped after ") +
                count(mJournal.boots().size(), "boot") + ", " +
                base::formatDuration(std::chrono::nanoseconds(mJournal.played())) +
                " of the device's time, in " + seconds + " s.\n\n");
}

}  // namespace report
