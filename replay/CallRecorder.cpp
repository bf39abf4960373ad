#include "replay/CallRecorder.h"

#include <cstddef>
#include <string>
#include <variant>
#include <vector>

namespace replay {

using trace::DeviceState;
using trace::Record;

namespace {

/** What a call tells. */
enum class Role : uint8_t { kNothing, kEnable, kCleanup, kNotification, kCharge, kTick, kReset };

constexpr struct {
    std::string_view name;
    Role role;
} kRoles[] = {
        {"SDCImpl.enableSuccess", Role::kEnable},
        {"SDCImpl.cleanupConnection", Role::kCleanup},
        {"SDCImpl.setNotification", Role::kNotification},
        {"SDCImpl.sendChargeState", Role::kCharge},
        {"SDCImpl.notifySdcClock", Role::kTick},
        {"SDCImpl.notifySdcReset", Role::kReset},
        {"SDCImpl.notifyRgbShotReset", Role::kReset},
        {"SDCImpl.notifyUltraReset", Role::kReset},
};

Role roleOf(size_t index) {
    static const std::vector<Role> kByIndex = [] {
        std::vector<Role> roles;
        for (const auto& [name, role] : kRoles) {
            const size_t call = *trace::findCall(name);
            if (roles.size() <= call) roles.resize(call + 1);
            roles[call] = role;
        }
        return roles;
    }();
    return index < kByIndex.size() ? kByIndex[index] : Role::kNothing;
}

}  // namespace

bool isRegistration(const trace::Call& call) {
    const Role role = roleOf(call.index);
    return role == Role::kEnable || role == Role::kCleanup;
}

void CallRecorder::record(const trace::Call& call, int64_t at, std::string_view note) {
    const auto& arguments = call.arguments;
    const auto text = [&](size_t i) {
        return std::string_view(std::get<std::string>(arguments[i]));
    };
    const auto number = [&](size_t i) { return std::get<int32_t>(arguments[i]); };
    const Role role = roleOf(call.index);
    switch (role) {
        case Role::kNothing:
            return;
        case Role::kEnable: {
            const bool isOn = std::get<bool>(arguments[0]);
            const int64_t period = isOn ? std::get<int64_t>(arguments[4]) : 0;
            mRecords->add({isOn ? Record::Kind::kEnable : Record::Kind::kDisable,
                           at,
                           {text(2), text(3), note},
                           period,
                           number(1)});
            return;
        }
        case Role::kCleanup:
            mRecords->add({Record::Kind::kDisable, at, {text(0), text(1), note}, 0, number(2)});
            return;
        case Role::kNotification:
            recordNotification(std::get<trace::IntList>(arguments[0]), at);
            return;
        case Role::kCharge:
            recordState(DeviceState::kCharge, number(0), at);
            return;
        case Role::kTick:
        case Role::kReset:
            mRecords->add({role == Role::kTick ? Record::Kind::kTick : Record::Kind::kReset,
                           at,
                           {trace::callName(call.index)},
                           number(0)});
            return;
    }
}

void CallRecorder::recordNotification(const trace::IntList& list, int64_t at) {
    for (const auto& [state, kind, element, on] : trace::kNotifications) {
        if (list.size() <= element || list[0] != kind) continue;
        const int32_t value = list[element];
        recordState(state, on ? (value == *on ? 1 : 0) : value, at);
    }
}

void CallRecorder::recordState(DeviceState state, int64_t value, int64_t at) {
    auto& last = mStates[static_cast<size_t>(state)];
    if (last == value) return;
    last = value;
    mRecords->add({Record::Kind::kState, at, {}, value, static_cast<int32_t>(state)});
}

}  // namespace replay
