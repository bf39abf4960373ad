#include "report/TimelineFile.h"

#include <cstring>
#include <string_view>
#include <utility>

#include "base/Calendar.h"
#include "day/Payload.h"
#include "report/DayRows.h"
#include "report/EventText.h"
#include "report/Names.h"
#include "report/Text.h"
#include "trace/CallTable.h"

namespace report {

using base::JsonWriter;
using trace::DeviceState;
using trace::Record;

namespace {

const Process kDevice{"device"};
const Process kLibrary{"library"};

constexpr std::string_view kTracks[] = {"display", "charger", "camera", "call"};  // by DeviceState

std::string nameState(DeviceState state, int64_t value) {
    constexpr const char* kCharges[] = {"not charging", "fast", "USB", "other"};
    switch (state) {
        case DeviceState::kDisplay:
        case DeviceState::kCamera:
            return value == 1 ? "on" : "off";
        case DeviceState::kCharge:
            return kCharges[value > 0 && value < 4 ? value : 0];
        case DeviceState::kCall:
            return value == 0 ? "none" : std::to_string(value);
    }
    return {};
}

}  // namespace

TimelineFile::TimelineFile(base::OutputFile* file, bool severalInputs)
      : mEvents(file->file()),
        mSeveralInputs(severalInputs),
        mTracker([this](const day::Use& use) { takeUse(use); }) {}

Process TimelineFile::processOf(const Process& process) const {
    return {mPrefix + process.name, process.isApp, mInput};
}

void TimelineFile::begin(const std::string& name) {
    mTracker.begin();
    ++mInput;
    if (mSeveralInputs) mPrefix = name + ": ";
    mIsDated = false;
    mOffset = 0;
    mAt = 0;
    mEvents.add(processOf(kDevice));
    mEvents.add(processOf(kLibrary));
}

/** A date moves an input to its place on the clock that all inputs share. */
void TimelineFile::date() {
    const auto day = mTracker.notes().firstDay;
    if (!mSeveralInputs || mIsDated || !day) return;
    mIsDated = true;
    if (!mFirstDay) mFirstDay = day;
    mOffset += (*day - *mFirstDay) * base::kNsPerDay;
    mBoot.since += (*day - *mFirstDay) * base::kNsPerDay;
}

void TimelineFile::take(const Record& record) {
    if (record.kind == Record::Kind::kExpect) return;  // its time is the recorded device's
    mTracker.take(record);
    if (record.kind == Record::Kind::kBoot) startBoot(record);
    if (record.kind == Record::Kind::kNote) date();
    if (mTracker.notes().isBehind(record.at)) return endKnown();
    mAt = record.at + mOffset;
    switch (record.kind) {
        case Record::Kind::kState: {
            const auto state = static_cast<DeviceState>(record.value);
            return change(state, nameState(state, record.number));
        }
        case Record::Kind::kReset:
            return mEvents.instant(processOf(kLibrary), "resets", record.texts[0], mAt,
                                   [&](JsonWriter* json) { json->member("hour", record.number); });
        case Record::Kind::kEvent:
            return takeEvent(record);
        case Record::Kind::kCounters:
            return takeCounters(record);
        case Record::Kind::kOver:
            return endBoot();
        default:
            return;
    }
}

void TimelineFile::startBoot(const Record& record) {
    const auto kind = static_cast<trace::BootKind>(record.value);
    if (kind == trace::BootKind::kDevice && mTracker.boot() > 0) mOffset = mAt - record.at;
    mBoot = {"boot of the " + std::string(nameOf(kind)), record.at + mOffset};
}

void TimelineFile::endBoot() {
    for (size_t i = 0; i < mStates.size(); ++i) change(static_cast<DeviceState>(i), "");
    if (!mBoot.name.empty()) {
        mEvents.slice(processOf(kDevice), "boots", mBoot.name, mBoot.since, mAt);
    }
    mBoot = {};
}

void TimelineFile::takeEvent(const Record& record) {
    const auto& id = record.texts[1];
    const day::Payload payload = day::takeApart(id, record.texts[2]);
    const std::string_view meaning = describe(payload.kind);
    mEvents.instant(processOf(kLibrary), "telemetry", meaning.empty() ? id : meaning, mAt,
                    [&](JsonWriter* json) {
                        json->member("id", id).key("fields");
                        writeFields(payload.fields, json);
                    });
}

void TimelineFile::takeCounters(const Record& record) {
    trace::Counters counters;
    std::memcpy(counters.data(), record.texts[0].data(), sizeof(counters));
    const auto samples = [&](size_t i) {
        return [value = counters[i]](JsonWriter* json) { json->member("samples", value); };
    };
    mEvents.counter(processOf(kLibrary), "sample budget", mAt, samples(0));
    mEvents.counter(processOf(kLibrary), "sample count", mAt, samples(1));
    mEvents.counter(processOf(kLibrary), "detect counts", mAt, [&](JsonWriter* json) {
        const int32_t* count = &counters[2];
        for (const int32_t type : trace::kDetected) json->member(nameType(type), *count++);
    });
}

void TimelineFile::takeUse(const day::Use& use) {
    const std::string sensor = nameSensor(use);
    const auto arguments = [&](JsonWriter* json) {
        json->member("rate in Hz", use.periodNs ? formatRate(*use.periodNs) : "unknown");
        json->member("enables", static_cast<int64_t>(use.enables.size()));
        json->member("still on", use.end == day::End::kOn);
        if (use.before) json->member("on before", true);
        if (use.end == day::End::kUnseen) json->member("end not seen", true);
        if (use.display.known > 0) json->member("display on", formatDisplay(use.display));
    };
    mEvents.slice(processOf({nameApp(use), true}), sensor, sensor, use.from + mOffset,
                  use.to + mOffset, arguments);
}

void TimelineFile::change(DeviceState state, const std::string& name) {
    Lasting& lasting = mStates[static_cast<size_t>(state)];
    if (lasting.name == name) return;
    if (!lasting.name.empty()) writeState(state, lasting.name, {lasting.since, mAt});
    lasting = {name, mAt};
}

/** A state counts where it is known. */
void TimelineFile::writeState(DeviceState state, const std::string& name, day::Span span) {
    const auto write = [&](const std::string& what, int64_t from, int64_t to) {
        mEvents.slice(processOf(kDevice), kTracks[static_cast<size_t>(state)], what, from, to);
    };
    const auto& known = mTracker.notes().known;
    if (!known) return write(name, span.from, span.to);
    const auto* const spans = state == DeviceState::kDisplay  ? &known->display
                              : state == DeviceState::kCharge ? &known->charge
                              : state == DeviceState::kCamera ? &known->camera
                                                              : &known->call;
    const day::Span clock{span.from - mOffset, span.to - mOffset};
    for (const day::Span& part : day::commonOf({clock}, day::spansOf(*spans))) {
        const int64_t from = part.from + mOffset;
        if (from > span.from) write("unknown", span.from, from);
        write(name, from, part.to + mOffset);
        span.from = part.to + mOffset;
    }
    if (span.from < span.to) write("unknown", span.from, span.to);
}

/** What follows is not what the device did. */
void TimelineFile::endKnown() {
    if (mBoot.name.empty()) return;
    const day::Notes& notes = mTracker.notes();
    mAt = *notes.knownTo() + mOffset;
    for (Lasting& lasting : mStates) {
        if (lasting.since == mAt) lasting = {};
    }
    endBoot();
    mEvents.instant(processOf(kDevice), "capture", "taken", mAt, [&](JsonWriter* json) {
        if (notes.capture && notes.capture->taken) json->member("at", *notes.capture->taken);
    });
}

void TimelineFile::end(bool) {
    mTracker.end();
    endBoot();
}

}  // namespace report
