#include "report/PageDay.h"

#include <algorithm>
#include <cstdint>
#include <map>
#include <utility>
#include <vector>

#include "base/Calendar.h"
#include "base/Json.h"
#include "day/Samples.h"
#include "report/CaptureFacts.h"
#include "report/DayRows.h"
#include "report/EventText.h"
#include "report/Format.h"
#include "report/Text.h"
#include "report/page/TableOf.h"

namespace report {

namespace {

using day::Span;
using day::Use;
using page::Mark;

std::string rateText(const Use& use) {
    if (use.mode == trace::SensorMode::kOneShot) return "one-shot";
    if (!use.periodNs) return "rate not known";
    return *use.periodNs > 0 ? formatRate(*use.periodNs) + " Hz" : "fastest";
}

std::string batchOf(int64_t us) {
    if (us < 0) return ", batched as long as possible";
    return us == 0 ? std::string() : ", batched " + base::formatMs(us * 1000) + " ms";
}

/** All of a use, in words, but the app and the sensor. */
std::string factsOf(const Use& use) {
    std::string text = (use.before ? "before " : "") + formatTimeOfDay(use.from) + " to " +
                       formatTimeOfDay(use.to);
    const int64_t days = use.to / base::kNsPerDay - use.from / base::kNsPerDay;
    if (days == 1) text += " of the next day";
    if (days > 1) text += ", " + count(static_cast<size_t>(days), "day") + " later";
    text += ", " + formatDuration(use.to - use.from) + ", " + rateText(use);
    if (use.batchUs) text += batchOf(*use.batchUs);
    if (use.wakeUp.value_or(false)) text += ", wake-up";
    if (use.enables.size() > 1) text += ", " + count(use.enables.size(), "enable");
    switch (use.end) {
        case day::End::kOff:
            return text;
        case day::End::kFired:
            return text + ", fired";
        case day::End::kUnseen:
            return text + ", its end was not seen";
        case day::End::kOn:
            return text + ", still on";
    }
    return text;
}

/** The last row of a day's table: what of the others can be added up. */
std::vector<page::Cell> totalOf(const std::vector<day::DayRow>& rows, const page::Table& table) {
    day::DayRow total;
    for (const day::DayRow& row : rows) {
        total.add(row);
        total.isBefore = total.isBefore || row.isBefore;
        total.isUnseen = total.isUnseen || row.isUnseen;
        total.samples = total.samples.value_or(0) + row.samples.value_or(0);
    }
    std::vector<page::Cell> cells;
    for (const page::Column& column : table.columns) {
        cells.push_back({column.key == "app"       ? "In all"
                         : column.key == "held"    ? formatHeld(total)
                         : column.key == "display" ? formatDisplay(total.display)
                         : column.key == "enables" ? std::to_string(total.enables)
                         : column.key == "samples" ? formatSamples(total.samples)
                                                   : ""});
    }
    return cells;
}

/** A day while it is made. */
class DayMaker {
public:
    DayMaker(const day::Journal& journal, const day::Day& day)
          : mJournal(journal),
            mDay(day),
            mBoot(journal.boots[static_cast<size_t>(day.boot)]),
            mNotes(mBoot.capture ? &journal.captures[*mBoot.capture] : nullptr),
            mMidnight(day.number * base::kNsPerDay) {}

    page::Day make() {
        mResult.name = nameDay(mJournal, mDay);
        mResult.display = bandOf(mJournal.display, &trace::KnownStates::display);
        mResult.charge = bandOf(mJournal.charge, &trace::KnownStates::charge);
        mResult.unseen = day::without(kDay, inDay(mBoot.seen));
        addMarks();
        addUses();
        return std::move(mResult);
    }

private:
    static constexpr Span kDay{0, base::kNsPerDay};

    /** What of spans of the clock lies in the day, counted from its midnight. */
    std::vector<Span> inDay(std::vector<Span> spans) const {
        for (Span& span : spans) span = {span.from - mMidnight, span.to - mMidnight};
        return day::commonOf(spans, {kDay});
    }

    /** A state, which without a capture is known where it is told. */
    page::Band bandOf(const std::vector<day::StateSpan>& states,
                      std::vector<trace::Interval> trace::KnownStates::*known) const {
        std::vector<Span> told;
        std::vector<Span> on;
        for (const day::StateSpan& state : states) {
            if (state.boot != mDay.boot) continue;
            told.push_back(state.span);
            if (state.isOn) on.push_back(state.span);
        }
        std::vector<Span> bounds{{mMidnight, mMidnight + base::kNsPerDay}};
        if (mNotes != nullptr && mNotes->known) bounds = day::spansOf(*mNotes->known.*known);
        return {inDay(day::commonOf(bounds, on)),
                day::without(kDay, inDay(day::commonOf(bounds, told)))};
    }

    void addMarks() {
        for (const day::Event* event : mJournal.eventsOf(mDay)) {
            mResult.marks.push_back({event->isAhead ? Mark::Kind::kAhead : Mark::Kind::kReport,
                                     event->at - mMidnight,
                                     (event->isAhead ? "if nothing changed: " : "") +
                                             layOutEvent(*event, 0).heading});
        }
        const auto end = mNotes != nullptr ? mNotes->knownTo() : std::nullopt;
        if (!end || *end / base::kNsPerDay != mDay.number) return;
        mResult.marks.push_back(
                {Mark::Kind::kTaken, *end - mMidnight, "known up to " + formatTimeOfDay(*end)});
    }

    void addUses() {
        const auto rows = mJournal.table.rowsOf(mDay);
        if (rows.empty()) return;
        mResult.uses =
                page::tableOf(dayTable(rows, Table::kAllRows), "uses", "Who held which sensor");
        if (rows.size() > 1) mResult.uses->total = totalOf(rows, *mResult.uses);
        std::map<day::HolderKey, std::vector<const Use*>> byRow;
        for (const Use& use : mJournal.uses) {
            if (use.boot != mDay.boot || use.from >= mMidnight + base::kNsPerDay) continue;
            if (use.to < mMidnight) continue;
            byRow[keyOf(use)].push_back(&use);
        }
        for (size_t i = 0; i < rows.size(); ++i) {
            const auto& cells = mResult.uses->rows[i];
            page::Lane lane{cells[0].text, cells[1].text, {}};
            for (const Use* use : byRow[keyOf(rows[i].holder)]) {
                if (const auto part = partOf(*use)) lane.uses.push_back(*part);
            }
            std::stable_sort(lane.uses.begin(), lane.uses.end(), [](const auto& a, const auto& b) {
                return a.span.from < b.span.from;
            });
            mResult.lanes.push_back(std::move(lane));
        }
    }

    /** What of a use lies in the day, if anything. */
    std::optional<page::Use> partOf(const Use& use) const {
        page::Use part;
        part.span = {std::max<int64_t>(use.from - mMidnight, 0),
                     std::min(use.to - mMidnight, base::kNsPerDay)};
        // A use that was off at once has its place, one that ends at midnight has none behind it.
        if (part.span.from >= part.span.to && use.from != use.to) return {};
        part.isBefore = use.before && use.from >= mMidnight;
        const bool isEnd = use.to <= mMidnight + base::kNsPerDay;
        part.isUnseen = use.end == day::End::kUnseen;
        part.isOn = isEnd && use.end == day::End::kOn;
        if (isContinuous(use)) part.rate = rateOf(use, use.periodNs);
        for (const day::Enable& enable : use.enables) {
            if (enable.at / base::kNsPerDay != mDay.number) continue;
            part.enables.push_back(enable.at - mMidnight);
        }
        part.facts = factsOf(use);
        return part;
    }

    const day::Journal& mJournal;
    const day::Day mDay;
    const day::Boot& mBoot;
    const day::Notes* const mNotes;  // of the capture, if there is one
    const int64_t mMidnight;
    page::Day mResult;
};

}  // namespace

page::Day pageDay(const day::Journal& journal, const day::Day& day) {
    return DayMaker(journal, day).make();
}

}  // namespace report
