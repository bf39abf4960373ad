#include "report/Summary.h"

#include <algorithm>
#include <cstdio>
#include <limits>

#include "report/OriginText.h"
#include "report/RealTime.h"
#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kShownRows = 20;

}  // namespace

Summary::Summary(Stdout* out, bool showsAll, bool hasColours)
      : mOut(out),
        mLimit(showsAll ? std::numeric_limits<size_t>::max() : kShownRows),
        mHasColours(hasColours) {}

void Summary::begin(const Input& input) {
    mJournal.begin(input);
    mStarted = realTime();
}

void Summary::end(bool isWhole) {
    if (!isWhole && mJournal.boots() == 0) return;
    mJournal.end();
    printOrigin();
    for (const Day& day : mJournal.days()) printDay(day);
    printReasons();
    if (!mJournal.properties().empty()) {
        printHeading("Stored at the end");
        mOut->write(layOut(mJournal.properties()).text(2));
    }
    printEnd(isWhole);
}

void Summary::printOrigin() {
    const Input& input = mJournal.input();
    mOut->write(emphasised(cut(safe(input.name), kWidth)) + '\n');
    for (const std::string& line : describe(input))
        mOut->write("  " + cut(line, kWidth - 2) + '\n');
}

void Summary::printDay(const Day& day) {
    printHeading(mJournal.nameDay(day));
    const std::vector<DayUse> uses = mJournal.uses().usesOf(day);
    if (!uses.empty()) mOut->write(layOut(uses, mJournal.input().origin, mLimit).text(2));
    bool isFirst = true;
    for (const auto& [boot, event] : mJournal.events()) {
        if (boot != day.boot || event.at / kNsPerDay != day.number) continue;
        if (isFirst) mOut->write("\nThe device reports:\n");
        isFirst = false;
        printEvent(event);
    }
    if (isFirst) mOut->write("\nThe device reports nothing.\n");
}

void Summary::printEvent(const Event& event) {
    const EventText text = layOut(event, mLimit);
    mOut->write("  " + cut(text.title, kWidth - 2) + '\n');
    for (const auto& [what, value] : text.values) {
        mOut->write("    " + cut(what + ": " + value, kWidth - 4) + '\n');
    }
    for (const Table& list : text.lists) mOut->write(list.text(4));
}

void Summary::printReasons() {
    const auto reasons = mJournal.reasons();
    if (reasons.empty()) return;
    printHeading("Why times held and times reported differ");
    for (const auto& [text, names] : reasons) {
        mOut->write("  " + text + ":\n");
        const size_t shown = std::min(names.size(), mLimit);
        for (size_t i = 0; i < shown; ++i) {
            mOut->write("    " + cut(safe(names[i]), kWidth - 4) + '\n');
        }
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
                count(mJournal.boots(), "boot") + ", " + formatDuration(mJournal.played()) +
                " of the device's time, in " + seconds + " s.\n\n");
}

void Summary::printHeading(const std::string& text) {
    mOut->write('\n' + emphasised(text) + '\n');
}

std::string Summary::emphasised(const std::string& text) const {
    return mHasColours ? "\x1b[1m" + text + "\x1b[0m" : text;
}

}  // namespace report
