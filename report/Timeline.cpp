#include "report/Timeline.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string_view>
#include <utility>

#include "report/OriginText.h"
#include "report/Payload.h"
#include "report/SensorNames.h"
#include "report/Text.h"
#include "trace/CallTable.h"
#include "trace/JsonText.h"

namespace report {

using trace::toJson;

namespace {

const Process kDevice{"device"};
const Process kLibrary{"library"};

constexpr const char* kResets[] = {"SDCImpl.notifySdcReset", "SDCImpl.notifyRgbShotReset",
                                   "SDCImpl.notifyUltraReset"};

constexpr const char* kFamilies[] = {"accelerometer", "gyroscope",   "magnetic field",
                                     "light",         "orientation", "rotation vector"};

std::string nameCharge(int32_t state) {
    constexpr const char* kNames[] = {"not charging", "fast", "USB", "other"};
    return state > 0 && state < 4 ? kNames[state] : kNames[0];
}

bool isReset(size_t call) {
    const std::string_view name = trace::callName(call);
    return std::find(std::begin(kResets), std::end(kResets), name) != std::end(kResets);
}

}  // namespace

Timeline::Timeline(std::string path)
      : mPath(std::move(path)),
        mUsage([this](const Slice& slice) { takeSlice(slice); }) {
    if (std::FILE* file = std::fopen(mPath.c_str(), "we")) {
        mEvents = std::make_unique<TraceEvents>(file);
    } else {
        fail();
    }
}

void Timeline::fail() {
    mFailure = trace::Failure{mPath + ": cannot write: " + std::strerror(errno)};
}

void Timeline::begin(const Input& input) {
    mInput = input;
    if (mEvents == nullptr) return;
    mEvents->add(kDevice);
    mEvents->add(kLibrary);
}

void Timeline::take(const Record& record) {
    if (mEvents == nullptr) return;
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    if (record.kind == Record::Kind::kBoot) takeBoot(record);
    mAt = record.at + mOffset;
    if (record.kind == Record::Kind::kCall) takeCall(record, mAt);
    if (record.kind == Record::Kind::kEvent) takeEvent(record, mAt);
    if (record.kind == Record::Kind::kCounters) takeCounters(record, mAt);
}

void Timeline::takeBoot(const Record& record) {
    endBoot();
    if (record.texts[0] == "device" && !mBoot.name.empty()) mOffset = mAt - record.at;
    mBoot = {"boot of the " + std::string(record.texts[0]), record.at + mOffset};
}

void Timeline::takeCall(const Record& record, int64_t at) {
    const trace::Call& call = mCalls.read(record);
    mUsage.call(at, call);
    showStates(at);
    if (isReset(call.index)) {
        mEvents->instant(kLibrary, "resets", trace::callName(call.index), at,
                         {{"hour", std::to_string(std::get<int32_t>(call.arguments[0]))}});
    }
}

void Timeline::takeEvent(const Record& record, int64_t at) {
    const auto& [module, id, payload] = record.texts;
    const Fields fields = takeApart(id, payload);
    const std::string_view meaning = describeEvent(id, fields);
    mEvents->instant(kLibrary, "telemetry", meaning.empty() ? id : meaning, at,
                     {{"id", toJson(id)}, {"fields", report::toJson(fields)}});
}

void Timeline::takeCounters(const Record& record, int64_t at) {
    trace::Counters counters;
    std::memcpy(counters.data(), record.texts[0].data(), sizeof(counters));
    mEvents->counter(kLibrary, "sample budget", at, {{"samples", std::to_string(counters[0])}});
    mEvents->counter(kLibrary, "sample count", at, {{"samples", std::to_string(counters[1])}});
    EventArguments detections;
    for (size_t i = 0; i < std::size(kFamilies); ++i) {
        detections.emplace_back(kFamilies[i], std::to_string(counters[2 + i]));
    }
    mEvents->counter(kLibrary, "detect counts", at, detections);
}

void Timeline::takeSlice(const Slice& slice) {
    const auto fastest = std::min_element(
            slice.enables.begin(), slice.enables.end(),
            [](const Enable& a, const Enable& b) { return a.periodNs < b.periodNs; });
    EventArguments arguments{{"rate in Hz", toJson(formatRate(fastest->periodNs))},
                             {"enables", std::to_string(slice.enables.size())},
                             {"still on", slice.isOpen ? "true" : "false"}};
    const auto on = mUsage.displayOn({slice.from, slice.to});
    if (on && slice.to > slice.from) {
        arguments.emplace_back("display on in %",
                               std::to_string(*on * 100 / (slice.to - slice.from)));
    }
    const std::string sensor = nameSensor(slice.type, mInput.origin);
    mEvents->slice({slice.app, true}, sensor, sensor, slice.from, slice.to, arguments);
}

void Timeline::change(const char* track, State* state, const std::string& name, int64_t at) {
    if (state->name == name) return;
    if (!state->name.empty()) mEvents->slice(kDevice, track, state->name, state->since, at, {});
    *state = {name, at};
}

void Timeline::showStates(int64_t at) {
    const DeviceState& state = mUsage.state();
    if (state.display) change("display", &mDisplay, *state.display ? "on" : "off", at);
    if (state.charge) change("charger", &mCharge, nameCharge(*state.charge), at);
    if (state.camera) change("camera", &mCamera, *state.camera ? "on" : "off", at);
    if (state.voice) {
        change("call", &mVoice, *state.voice == 0 ? "none" : std::to_string(*state.voice), at);
    }
}

void Timeline::endBoot() {
    if (mBoot.name.empty()) return;
    mUsage.end(lastKnown(mInput, mAt));
    change("display", &mDisplay, "", mAt);
    change("charger", &mCharge, "", mAt);
    change("camera", &mCamera, "", mAt);
    change("call", &mVoice, "", mAt);
    mEvents->slice(kDevice, "boots", mBoot.name, mBoot.since, mAt, {});
}

void Timeline::end(bool) {
    if (mEvents == nullptr) return;
    endBoot();
    if (!mEvents->close()) fail();
    mEvents.reset();
}

}  // namespace report
