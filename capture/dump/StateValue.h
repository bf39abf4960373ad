#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "trace/Words.h"

namespace capture {

using State = trace::DeviceState;

/** In the order in which a host tells them. */
inline constexpr std::array<State, trace::kDeviceStates> kStates = {State::kDisplay, State::kCharge,
                                                                    State::kCamera, State::kCall};

// Values as the calls take them. The camera and a call are 1 (on) or 0.

inline constexpr int kDisplayOff = 1;
inline constexpr int kDisplayOn = 2;

inline constexpr int kUnplugged = 0;
inline constexpr int kPluggedAc = 1;
inline constexpr int kPluggedUsb = 2;
inline constexpr int kPluggedOther = 3;

/** What a state is while it is not in use. */
constexpr int idleValue(State state) {
    return state == State::kDisplay ? kDisplayOff : 0;
}

/** A state has this value from `at` on. */
struct StateValue {
    int64_t at;  // a wall time
    State state;
    int value;
};

}  // namespace capture
