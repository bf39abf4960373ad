#include "day/Journal.h"

#include <algorithm>
#include <set>

#include "base/Calendar.h"

namespace day {

using trace::DeviceState;
using trace::Record;

namespace {

constexpr int64_t kReportHour = 23;
constexpr std::string_view kReset = "SDCImpl.notifySdcReset";  // of what is reported at that hour

}  // namespace

JournalWriter::JournalWriter()
      : mTracker([this](const Use& use) {
            mJournal.table.add(use, mTracker);
            mJournal.uses.push_back(use);
        }) {}

void JournalWriter::begin(const std::string& name) {
    mTracker.begin();
    mJournal = {};
    mJournal.name = name;
    mFirstBoot = 0;
}

void JournalWriter::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    if (record.kind == Record::Kind::kBoot) startBoot(record);
    mTracker.take(record);
    mJournal.boots.back().span.to = record.at;
    switch (record.kind) {
        case Record::Kind::kState:
            return takeState(record);
        case Record::Kind::kTick:
            if (record.number == kReportHour) {
                mJournal.dailyCalls.push_back({mTracker.boot(), record.at, false});
            }
            return;
        case Record::Kind::kReset:
            if (record.number == kReportHour && first == kReset) {
                mJournal.dailyCalls.push_back({mTracker.boot(), record.at, true});
            }
            return;
        case Record::Kind::kEvent:
            mJournal.events.push_back({mTracker.boot(), record.at, std::string(second),
                                       takeApart(second, third),
                                       mTracker.notes().isBehind(record.at)});
            return;
        case Record::Kind::kProperty:
            mJournal.properties[std::string(first)] = second;
            return;
        default:
            return;
    }
}

const Journal& JournalWriter::end() {
    mTracker.end();
    endBoot(true);
    keepCapture();
    return mJournal;
}

void JournalWriter::startBoot(const Record& record) {
    const bool isDeviceBoot = record.value == static_cast<int32_t>(trace::BootKind::kDevice);
    endBoot(isDeviceBoot);
    if (isDeviceBoot) keepCapture();
    mJournal.boots.emplace_back().span = {record.at, record.at};
}

void JournalWriter::endBoot(bool isLast) {
    if (mJournal.boots.empty()) return;
    const Notes& notes = mTracker.notes();
    Boot& last = mJournal.boots.back();
    last.firstDay = notes.firstDay;
    // What is on when the capture is taken may be known for longer than the trace lasts.
    int64_t to = notes.knownTo().value_or(last.span.to);
    if (!isLast) to = std::min(to, last.span.to);
    last.seen = without({last.span.from, to}, spansOf(notes.gaps));
    for (const Span& span : last.seen) last.display.add(mTracker.displayIn(span));
    const auto boot = static_cast<int64_t>(mJournal.boots.size()) - 1;
    for (auto* spans : {&mJournal.display, &mJournal.charge}) {
        if (!spans->empty() && spans->back().boot == boot) {
            spans->back().span.to = last.span.to;
        }
    }
}

void JournalWriter::keepCapture() {
    const Notes& notes = mTracker.notes();
    mJournal.lost.insert(mJournal.lost.end(), notes.lost.begin(), notes.lost.end());
    if (notes.capture) {
        for (size_t i = mFirstBoot; i < mJournal.boots.size(); ++i)
            mJournal.boots[i].capture = mJournal.captures.size();
        mJournal.captures.push_back(notes);
    }
    mFirstBoot = mJournal.boots.size();
}

void JournalWriter::takeState(const Record& record) {
    const auto state = static_cast<DeviceState>(record.value);
    if (state != DeviceState::kDisplay && state != DeviceState::kCharge) return;
    auto& spans = state == DeviceState::kDisplay ? mJournal.display : mJournal.charge;
    const int64_t boot = mTracker.boot();
    if (!spans.empty() && spans.back().boot == boot) spans.back().span.to = record.at;
    // The display has 1 for on, the charger 1 to 3 by its kind.
    spans.push_back({boot, {record.at, record.at}, record.number >= 1 && record.number <= 3});
}

int64_t Journal::played() const {
    int64_t played = 0;
    for (const Boot& boot : boots) played += boot.span.to - boot.span.from;
    return played;
}

std::vector<Day> Journal::days() const {
    std::set<Day> found;
    for (const Day& day : table.days()) found.insert(day);
    for (const Event& event : events) found.insert({event.boot, event.at / base::kNsPerDay});
    return {found.begin(), found.end()};
}

std::vector<const Event*> Journal::eventsOf(const Day& day) const {
    std::vector<const Event*> found;
    for (const Event& event : events) {
        if (event.boot == day.boot && event.at / base::kNsPerDay == day.number) {
            found.push_back(&event);
        }
    }
    return found;
}

std::vector<Span> Journal::seenOf(size_t capture) const {
    std::vector<Span> seen;
    for (const Boot& boot : boots) {
        if (boot.capture == capture) seen.insert(seen.end(), boot.seen.begin(), boot.seen.end());
    }
    return seen;
}

BatteryCoverage Journal::batteryCoverage(size_t capture) const {
    const Notes& notes = captures[capture];
    const std::vector<Span> seen = seenOf(capture);
    const std::vector<Span> known =
            notes.known ? commonOf(seen, spansOf(notes.known->charge)) : std::vector<Span>();
    std::vector<Span> plugged;
    for (const StateSpan& state : charge) {
        if (isOf(state.boot, capture) && state.isOn) plugged.push_back(state.span);
    }
    BatteryCoverage coverage;
    coverage.seen = lengthOf(seen) - lengthOf(commonOf(known, plugged));
    coverage.isUpperBound = lengthOf(known) < lengthOf(seen);
    if (const auto& onBatteryMs = notes.taken->sinceCharge->onBatteryMs) {
        coverage.seen = std::min(coverage.seen, toClock(*onBatteryMs));
    }
    return coverage;
}

}  // namespace day
