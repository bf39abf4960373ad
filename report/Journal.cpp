#include "report/Journal.h"

#include <algorithm>
#include <set>

#include "report/OriginText.h"
#include "report/Text.h"

namespace report {

namespace {

constexpr int32_t kReportHour = 23;

}  // namespace

Journal::Journal()
      : mUsage([this](const Slice& slice) {
            mUses.add(mBoot, slice, mUsage);
            mSlices.push_back({mBoot, slice});
        }) {}

void Journal::begin(const Input& input) {
    mInput = input;
    mUses = {};
    mSlices.clear();
    mReports.clear();
    mEvents.clear();
    mDisplay.clear();
    mCharge.clear();
    mProperties.clear();
    mBoot = -1;
    mPlayed = 0;
}

void Journal::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    if (record.kind == Record::Kind::kBoot) takeBoot(record);
    mAt = record.at;
    if (record.kind == Record::Kind::kCall) {
        takeCall(record);
    } else if (record.kind == Record::Kind::kEvent) {
        mEvents.push_back({mBoot, {record.at, std::string(second), takeApart(second, third)}});
    } else if (record.kind == Record::Kind::kProperty) {
        mProperties[std::string(first)] = second;
    }
}

void Journal::takeBoot(const Record& record) {
    endBoot();
    ++mBoot;
    mBootAt = record.at;
}

void Journal::takeCall(const Record& record) {
    static const auto kClock = trace::findCall("SDCImpl.notifySdcClock");
    const trace::Call& call = mCalls.read(record);
    mUsage.call(record.at, call);
    const DeviceState& state = mUsage.state();
    if (state.display) noteState(&mDisplay, *state.display ? 1 : 0, record.at);
    if (state.charge) noteState(&mCharge, *state.charge, record.at);
    if (call.index == kClock && std::get<int32_t>(call.arguments[0]) == kReportHour) {
        mReports.push_back({mBoot, record.at});
    }
}

void Journal::noteState(std::vector<StateSpan>* spans, int32_t value, int64_t at) const {
    if (!spans->empty() && spans->back().boot == mBoot) {
        spans->back().span.to = at;
        if (spans->back().value == value) return;
    }
    spans->push_back({mBoot, {at, at}, value});
}

void Journal::endBoot() {
    if (mBoot < 0) return;
    mUsage.end(lastKnown(mInput, mAt));
    for (auto* spans : {&mDisplay, &mCharge}) {
        if (!spans->empty() && spans->back().boot == mBoot) spans->back().span.to = mAt;
    }
    mPlayed += mAt - mBootAt;
}

void Journal::end() {
    endBoot();
}

std::vector<Day> Journal::days() const {
    std::set<Day> days;
    for (const Day& day : mUses.days()) days.insert(day);
    for (const auto& [boot, event] : mEvents) days.insert({boot, event.at / kNsPerDay});
    return {days.begin(), days.end()};
}

std::string Journal::nameDay(const Day& day) const {
    if (mInput.origin != nullptr && mInput.origin->firstDay) {
        return formatDate(*mInput.origin->firstDay + day.number);
    }
    const std::string name = "day " + std::to_string(day.number + 1);
    return boots() == 1 ? name : "boot " + std::to_string(day.boot + 1) + ", " + name;
}

std::vector<Reason> Journal::reasons() const {
    return explainDifferences(mSlices, mReports, mInput.origin);
}

}  // namespace report
