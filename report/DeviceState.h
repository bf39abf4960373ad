#pragma once

#include <cstdint>
#include <optional>

#include "trace/TraceLine.h"

namespace report {

/** What the host has told of the device's state; nothing yet: unknown. */
struct DeviceState {
    std::optional<bool> display;    // on
    std::optional<int32_t> charge;  // 1 fast, 2 USB, 3 other, else none
    std::optional<bool> camera;     // on
    std::optional<int32_t> voice;   // the voice mode: 0 no call

    /** Takes a call that may tell of the state; whether it does. */
    bool take(const trace::Call& call);
};

}  // namespace report
