#include "report/DeviceState.h"

#include <cstddef>

namespace report {

namespace {

/** Of a notification: its kind, and the element that has the value. */
constexpr struct {
    int32_t kind;
    size_t element;
} kDisplay{2, 2}, kVoice{7, 7}, kCamera{10, 11};

constexpr int32_t kDisplayOn = 2;

bool takeNotification(const trace::IntList& list, DeviceState* state) {
    const auto holds = [&](const auto& form) {
        return !list.empty() && list[0] == form.kind && list.size() > form.element;
    };
    if (holds(kDisplay)) {
        state->display = list[kDisplay.element] == kDisplayOn;
    } else if (holds(kVoice)) {
        state->voice = list[kVoice.element];
    } else if (holds(kCamera)) {
        state->camera = list[kCamera.element] == 1;
    } else {
        return false;
    }
    return true;
}

}  // namespace

bool DeviceState::take(const trace::Call& call) {
    static const auto kNotification = trace::findCall("SDCImpl.setNotification");
    static const auto kCharge = trace::findCall("SDCImpl.sendChargeState");
    if (call.index == kNotification) {
        return takeNotification(std::get<trace::IntList>(call.arguments[0]), this);
    }
    if (call.index != kCharge) return false;
    charge = std::get<int32_t>(call.arguments[0]);
    return true;
}

}  // namespace report
