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
#include "report/RealTime.h"
#include "report/Text.h"

namespace report {

Summary::Summary(Stdout* out, bool showsAll, bool hasColours, std::optional<size_t> columns)
      : mOut(out),
        mLimit(showsAll ? Table::kAllRows : Table::kShownRows),
        mHasColours(hasColours),
        mColumns(columns) {}

void Summary::begin(const std::string& name) {
    mJournal.begin(name);
    mStarted = realTime();
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
        printHeading("Stored at the end");
        printTable(propertyTable(mJournal.properties()), 2);
    }
    printEnd(isWhole);
}

void Summary::printCaptures() {
    const std::string name = safe(mJournal.name());
    mOut->write(emphasised(mColumns ? cut(name, *mColumns) : name) + '\n');
    for (const std::string& line : describeCaptures(mJournal)) printSentence(line, 2);
}

void Summary::printFindings() {
    if (!hasFindings(mJournal)) return;
    printHeading("Findings");
    for (const std::string& sentence : describeFindings(mJournal)) {
        printSentence("- " + sentence, 2);
    }
}

void Summary::printOnNow(size_t capture) {
    const OnNowText text = describeOnNow(mJournal, capture, mLimit);
    printHeading(kOnNowHeading);
    for (const std::string& line : text.before) printSentence(line, 2);
    if (!text.rows.isEmpty()) printTable(text.rows, 2);
    for (const std::string& line : text.after) printSentence(line, 2);
}

void Summary::printDay(const day::Day& day) {
    printHeading(nameDay(mJournal, day));
    printTable(dayTable(mJournal.table().rowsOf(day), mLimit), 2);
}

void Summary::printSinceCharge(size_t capture) {
    const auto& taken = mJournal.captures()[capture].taken();
    if (!taken || !taken->sinceCharge) return;
    const ChargeText text = describeSinceCharge(mJournal, capture, mLimit);
    printHeading(kChargeHeading);
    printSentence(text.line, 2);
    if (!text.rows.isEmpty()) printTable(text.rows, 2);
}

void Summary::printReports() {
    std::vector<const day::Event*> known;
    std::vector<const day::Event*> ahead;
    for (const day::Event& event : mJournal.events()) {
        (event.isAhead ? ahead : known).push_back(&event);
    }
    if (known.empty()) {
        printHeading("The device reports nothing");
    } else {
        printHeading("The device reports");
        printEvents(known);
    }
    if (ahead.empty()) return;
    printHeading("Would report, if nothing changed");
    for (const std::string& line : describeBounds(mJournal)) printSentence(line, 2);
    printEvents(ahead);
}

/** In order, each day's under its name. */
void Summary::printEvents(const std::vector<const day::Event*>& events) {
    std::optional<day::Day> last;
    for (const day::Event* event : events) {
        const day::Day day{event->boot, event->at / base::kNsPerDay};
        if (!last || *last < day) printName(nameDay(mJournal, day), 2);
        last = day;
        printEvent(*event);
    }
}

void Summary::printEvent(const day::Event& event) {
    const EventText text = layOutEvent(event, mLimit);
    printName(text.title, 4);
    for (const auto& [what, value] : text.values) printName(what + ": " + value, 6);
    for (const Table& list : text.lists) printTable(list, 6);
}

void Summary::printCauses() {
    const auto causes = describeCauses(mJournal.causes());
    if (causes.empty()) return;
    printHeading("Why times held and times reported differ");
    for (const auto& [text, names] : causes) {
        printSentence(text + ":", 2);
        const size_t shown = std::min(names.size(), mLimit);
        for (size_t i = 0; i < shown; ++i) printName(safe(names[i]), 4);
        if (shown < names.size()) {
            mOut->write("    and " + std::to_string(names.size() - shown) + " more\n");
        }
    }
}

void Summary::printEnd(bool isWhole) {
    char seconds[32];
    std::snprintf(seconds, sizeof(seconds), "%.3f",
                  static_cast<double>(realTime() - mStarted) / 1e9);
    mOut->write(std::string(isWhole ? "\nPlayed " : "\nStopped after ") +
                count(mJournal.boots().size(), "boot") + ", " +
                base::formatDuration(std::chrono::nanoseconds(mJournal.played())) +
                " of the device's time, in " + seconds + " s.\n\n");
}

void Summary::printHeading(const std::string& text) {
    mOut->write('\n' + emphasised(text) + '\n');
}

void Summary::printTable(const Table& table, size_t indent) {
    mOut->write(table.text(indent, mColumns));
}

void Summary::printName(const std::string& text, size_t indent) {
    mOut->write(std::string(indent, ' ') + (mColumns ? cut(text, *mColumns - indent) : text) +
                '\n');
}

void Summary::printSentence(const std::string& text, size_t indent) {
    const auto lines = mColumns ? wrap(text, *mColumns - indent - 2) : std::vector{text};
    for (const std::string& line : lines) {
        mOut->write(std::string(&line == lines.data() ? indent : indent + 2, ' ') + line + '\n');
    }
}

std::string Summary::emphasised(const std::string& text) const {
    return mHasColours ? "\x1b[1m" + text + "\x1b[0m" : text;
}

}  // namespace report
