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

Journal::Journal()
      : mTracker([this](const Use& use) {
            mTable.add(use, mTracker);
            mUses.push_back(use);
        }) {}

void Journal::begin(const std::string& name) {
    mName = name;
    mTracker.begin();
    mCaptures.clear();
    mBoots.clear();
    mFirstBoot = 0;
    mUses.clear();
    mTable = {};
    mDailyCalls.clear();
    mLost.clear();
    mEvents.clear();
    mDisplay.clear();
    mCharge.clear();
    mProperties.clear();
}

void Journal::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    if (record.kind == Record::Kind::kBoot) startBoot(record);
    mTracker.take(record);
    mBoots.back().span.to = record.at;
    switch (record.kind) {
        case Record::Kind::kState:
            return takeState(record);
        case Record::Kind::kTick:
            if (record.number == kReportHour) {
                mDailyCalls.push_back({mTracker.boot(), record.at, false});
            }
            return;
        case Record::Kind::kReset:
            if (record.number == kReportHour && first == kReset) {
                mDailyCalls.push_back({mTracker.boot(), record.at, true});
            }
            return;
        case Record::Kind::kEvent:
            mEvents.push_back({mTracker.boot(), record.at, std::string(second),
                               takeApart(second, third), mTracker.notes().isBehind(record.at)});
            return;
        case Record::Kind::kProperty:
            mProperties[std::string(first)] = second;
            return;
        default:
            return;
    }
}

void Journal::end() {
    mTracker.end();
    endBoot(true);
    keepCapture();
}

void Journal::startBoot(const Record& record) {
    const bool isDeviceBoot = record.value == static_cast<int32_t>(trace::BootKind::kDevice);
    endBoot(isDeviceBoot);
    if (isDeviceBoot) keepCapture();
    mBoots.emplace_back().span = {record.at, record.at};
}

void Journal::endBoot(bool isLast) {
    if (mBoots.empty()) return;
    const Notes& notes = mTracker.notes();
    Boot& last = mBoots.back();
    last.firstDay = notes.firstDay();
    // What is on when the capture is taken may be known for longer than the trace lasts.
    int64_t to = notes.knownTo().value_or(last.span.to);
    if (!isLast) to = std::min(to, last.span.to);
    last.seen = without({last.span.from, to}, spansOf(notes.gaps()));
    for (const Span& span : last.seen) {
        const DisplayTime display = mTracker.displayIn(span);
        last.display.known += display.known;
        last.display.on += display.on;
    }
    const auto boot = static_cast<int64_t>(mBoots.size()) - 1;
    for (auto* spans : {&mDisplay, &mCharge}) {
        if (!spans->empty() && spans->back().boot == boot) {
            spans->back().span.to = last.span.to;
        }
    }
}

void Journal::keepCapture() {
    const Notes& notes = mTracker.notes();
    mLost.insert(mLost.end(), notes.lost().begin(), notes.lost().end());
    if (notes.capture()) {
        for (size_t i = mFirstBoot; i < mBoots.size(); ++i) mBoots[i].capture = mCaptures.size();
        mCaptures.push_back(notes);
    }
    mFirstBoot = mBoots.size();
}

void Journal::takeState(const Record& record) {
    const auto state = static_cast<DeviceState>(record.value);
    if (state != DeviceState::kDisplay && state != DeviceState::kCharge) return;
    auto& spans = state == DeviceState::kDisplay ? mDisplay : mCharge;
    const int64_t boot = mTracker.boot();
    if (!spans.empty() && spans.back().boot == boot) spans.back().span.to = record.at;
    spans.push_back({boot, {record.at, record.at}, record.number});
}

int64_t Journal::played() const {
    int64_t played = 0;
    for (const Boot& boot : mBoots) played += boot.span.to - boot.span.from;
    return played;
}

std::vector<Day> Journal::days() const {
    std::set<Day> days;
    for (const Day& day : mTable.days()) days.insert(day);
    for (const Event& event : mEvents) days.insert({event.boot, event.at / base::kNsPerDay});
    return {days.begin(), days.end()};
}

std::vector<const Event*> Journal::eventsOf(const Day& day) const {
    std::vector<const Event*> events;
    for (const Event& event : mEvents) {
        if (event.boot == day.boot && event.at / base::kNsPerDay == day.number) {
            events.push_back(&event);
        }
    }
    return events;
}

}  // namespace day
