#include "report/Summary.h"

#include <cstdio>

#include "report/CaptureFacts.h"
#include "report/DayRows.h"
#include "report/FindingText.h"
#include "report/Sections.h"
#include "report/Text.h"

namespace report {

void Summary::begin(const std::string& name) {
    mWriter.begin(name);
}

void Summary::end(bool isWhole) {
    const day::Journal& journal = mWriter.end();
    if (!isWhole && journal.boots.empty()) return;
    mTerminal.title(safe(journal.name));
    for (const std::string& line : describeCaptures(journal)) mTerminal.sentence(line, 2);
    if (hasFindings(journal)) {
        mTerminal.heading("Findings");
        for (const std::string& sentence : describeFindings(journal)) {
            mTerminal.sentence("- " + sentence, 2);
        }
    }
    for (const Section& section : sectionsBefore(journal, mLimit)) mTerminal.section(section);
    for (const day::Day& day : journal.table.days()) {
        mTerminal.heading(nameDay(journal, day));
        mTerminal.table(dayTable(journal.table.rowsOf(day), mLimit), 2);
    }
    for (const Section& section : sectionsAfter(journal, mLimit)) mTerminal.section(section);
    char seconds[32];
    std::snprintf(seconds, sizeof(seconds), "%.3f", static_cast<double>(mTook) / 1e9);
    mOut->write((isWhole ? "\nPlayed " : "\nStopped after ") + describePlayed(journal) + ", in " +
                seconds + " s.\n\n");
}

}  // namespace report
