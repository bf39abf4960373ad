#include "report/Page.h"

#include "report/CaptureFacts.h"
#include "report/FindingText.h"
#include "report/PageDay.h"
#include "report/Sections.h"
#include "report/Text.h"

namespace report {

void Page::end(bool isWhole) {
    const day::Journal& journal = mWriter.end();
    mSides.add(journal);
    page::Input input;
    input.name = safe(journal.name);
    input.lines = describeCaptures(journal);
    if (!isWhole) input.lines.emplace_back("The replay has stopped before the end.");
    if (hasFindings(journal)) input.findings = describeFindings(journal);
    input.before = sectionsBefore(journal, Table::kAllRows);
    for (const day::Day& day : journal.days()) input.days.push_back(pageDay(journal, day));
    input.after = sectionsAfter(journal, Table::kAllRows);
    input.end = "Played " + describePlayed(journal) + '.';
    mPages.add(input);
}

void Page::finish() {
    auto first = mSides.layOut(Table::kAllRows);
    if (first && first->parts.empty()) first->lines.emplace_back(kNothingDiffers);
    if (!mPages.finish(mFile->file(), first)) mFailure = mFile->failure();
}

}  // namespace report
