#include "capture/HostDay.h"

#include <algorithm>

#include "capture/WallTime.h"
#include "trace/JsonText.h"

namespace capture {

namespace {

constexpr int64_t kResetDelay = 10 * kMsPerSecond;  // from an hour's reports to its resets
constexpr int64_t kEndOfDay = 23 * kMsPerHour + 20 * kMsPerSecond;

constexpr int kSystemUid = 1000;

/** The list by which the host tells a state; empty if it has a call of its own. */
std::string_view notificationOf(State state) {
    switch (state) {
        case State::kDisplay:
            return "2, 0, ";
        case State::kCharge:
            return "";
        case State::kCamera:
            return "10, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, ";
        case State::kCall:
            return "7, 0, 0, 0, 0, 0, 0, ";
    }
    return "";
}

}  // namespace

void HostDay::start(int64_t at) {
    call(at, "SDCImpl.getInstance");
    call(at, "FlowingDataException.notifyBootCompleted");
    call(at, "SDCImpl.sendBootShutdownRebootState", "1");
    call(at, "SDCImpl.sendUsedTime", "1");
    mNextHour = at / kMsPerHour + 1;
}

void HostDay::state(int64_t at, State state, int value) {
    ticksUpTo(at);
    const std::string_view list = notificationOf(state);
    if (list.empty()) {
        call(at, "SDCImpl.sendChargeState", std::to_string(value));
    } else {
        call(at, "SDCImpl.setNotification",
             std::string("[").append(list) + std::to_string(value) + "]");
    }
    mLastState = at;
}

void HostDay::registration(int64_t at, const Registration& registration, int32_t type) {
    ticksUpTo(at);
    const std::string package = trace::toJson(registration.package);
    const std::string opPackage = registration.uid == kSystemUid ? "\"android\"" : package;
    const int64_t rate = registration.on ? registration.periodUs * 1000 : 0;
    call(at, "SDCImpl.enableSuccess",
         std::string(registration.on ? "true" : "false") + ", " + std::to_string(type) + ", " +
                 package + ", " + opPackage + ", " + std::to_string(rate));
}

void HostDay::end(int64_t lastLine) {
    const int64_t last = std::max(lastLine, mLastState);
    const int64_t days = (last - kEndOfDay + kMsPerDay - 1) / kMsPerDay;
    const int64_t at = std::max<int64_t>(days, 0) * kMsPerDay + kEndOfDay;
    ticksUpTo(at);
    *mTrace += "{\"at\": " + std::to_string(at) + "}\n";
}

void HostDay::ticksUpTo(int64_t time) {
    for (;; mReset = !mReset) {
        const int64_t at = mNextHour * kMsPerHour + (mReset ? kResetDelay : 0);
        if (at > time) return;
        mReset ? resets(at) : reports(at);
        if (mReset) ++mNextHour;
    }
}

void HostDay::reports(int64_t at) {
    if (mNextHour % 24 == 0) {
        call(at, "SDCImpl.sendUsedTime", std::to_string(mNextHour / 24 + 1));  // days begun
    }
    const std::string hour = std::to_string(mNextHour % 24);
    call(at, "SDCImpl.notifySdcClock", hour);
    call(at, "SDCImpl.putRgbShotTally", hour);
    call(at, "SDCImpl.putPhoneOpenUltraTally", hour);
}

void HostDay::resets(int64_t at) {
    const std::string hour = std::to_string(mNextHour % 24);
    call(at, "SDCImpl.notifySdcReset", hour);
    call(at, "SDCImpl.notifyRgbShotReset", hour);
    call(at, "SDCImpl.notifyUltraReset", hour);
}

void HostDay::call(int64_t at, std::string_view name, std::string_view arguments) {
    *mTrace += "{\"at\": " + std::to_string(at) + ", \"call\": \"";
    mTrace->append(name).append("\"");
    if (!arguments.empty()) mTrace->append(", \"args\": [").append(arguments).append("]");
    mTrace->append("}\n");
}

}  // namespace capture
