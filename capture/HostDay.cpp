#include "capture/HostDay.h"

#include <algorithm>
#include <iterator>

#include "base/Json.h"
#include "capture/dump/WallTime.h"

namespace capture {

namespace {

constexpr int64_t kResetDelay = 10 * kMsPerSecond;  // from an hour's reports to its resets
constexpr int64_t kEndOfDay = 23 * kMsPerHour + 20 * kMsPerSecond;

}  // namespace

HostDay::HostDay(int64_t start, std::string* trace)
      : mStart(start),
        mTrace(trace),
        mNextHour(start / kMsPerHour + 1) {}

void HostDay::writeStart() {
    writeCall(mStart, "SDCImpl.getInstance");
    writeCall(mStart, "FlowingDataException.notifyBootCompleted");
    writeCall(mStart, "SDCImpl.sendBootShutdownRebootState", 1);
    writeCall(mStart, "SDCImpl.sendUsedTime", 1);
}

void HostDay::writeState(int64_t at, State state, int value) {
    writeTicksUpTo(at);
    if (state == State::kCharge) return writeCall(at, "SDCImpl.sendChargeState", value);
    const auto* notification =
            std::find_if(std::begin(trace::kNotifications), std::end(trace::kNotifications),
                         [&](const trace::Notification& each) { return each.state == state; });
    base::JsonWriter json(mTrace);
    json.beginObject().member("at", at).member("call", "SDCImpl.setNotification");
    json.key("args").beginArray().beginArray().value(notification->kind);
    for (size_t i = 1; i < notification->element; ++i) json.value(0);
    json.value(value).endArray().endArray().endObject();
    *mTrace += '\n';
}

void HostDay::writeEnable(int64_t at, const EnableCall& call, const trace::Note& note) {
    writeTicksUpTo(at);
    base::JsonWriter json(mTrace);
    json.beginObject().member("at", at).member("call", "SDCImpl.enableSuccess");
    json.key("args").beginArray().value(call.on).value(call.type);
    json.value(call.package).value(call.opPackage);
    json.value(call.on ? call.periodUs * 1000 : 0).endArray();
    json.key("note");
    writeNote(note, &json);
    json.endObject();
    *mTrace += '\n';
}

void HostDay::writeLine(int64_t at, const trace::Note& note) {
    writeTicksUpTo(at);
    base::JsonWriter json(mTrace);
    json.beginObject().member("at", at).key("note");
    writeNote(note, &json);
    json.endObject();
    *mTrace += '\n';
}

void HostDay::writeEnd(int64_t at) {
    writeTicksUpTo(at);
    base::JsonWriter(mTrace).beginObject().member("at", at).endObject();
    *mTrace += '\n';
}

int64_t HostDay::endOf(int64_t last) {
    const int64_t days = (last - kEndOfDay + kMsPerDay - 1) / kMsPerDay;
    return std::max<int64_t>(days, 0) * kMsPerDay + kEndOfDay;
}

void HostDay::writeTicksUpTo(int64_t time) {
    for (;; mReset = !mReset) {
        const int64_t at = mNextHour * kMsPerHour + (mReset ? kResetDelay : 0);
        if (at > time) return;
        mReset ? writeResets(at) : writeReports(at);
        if (mReset) ++mNextHour;
    }
}

void HostDay::writeReports(int64_t at) {
    if (mNextHour % 24 == 0) {
        writeCall(at, "SDCImpl.sendUsedTime", mNextHour / 24 + 1);  // days begun
    }
    const int64_t hour = mNextHour % 24;
    writeCall(at, "SDCImpl.notifySdcClock", hour);
    writeCall(at, "SDCImpl.putRgbShotTally", hour);
    writeCall(at, "SDCImpl.putPhoneOpenUltraTally", hour);
}

void HostDay::writeResets(int64_t at) {
    const int64_t hour = mNextHour % 24;
    writeCall(at, "SDCImpl.notifySdcReset", hour);
    writeCall(at, "SDCImpl.notifyRgbShotReset", hour);
    writeCall(at, "SDCImpl.notifyUltraReset", hour);
}

void HostDay::writeCall(int64_t at, std::string_view name) {
    base::JsonWriter(mTrace).beginObject().member("at", at).member("call", name).endObject();
    *mTrace += '\n';
}

void HostDay::writeCall(int64_t at, std::string_view name, int64_t argument) {
    base::JsonWriter json(mTrace);
    json.beginObject().member("at", at).member("call", name);
    json.key("args").beginArray().value(argument).endArray().endObject();
    *mTrace += '\n';
}

}  // namespace capture
