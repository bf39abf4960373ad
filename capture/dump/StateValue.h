#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace capture {

/** What a host tells the library of the device, in the order in which it does. */
enum class State { kDisplay, kCharge, kCamera, kCall };

inline constexpr std::array<State, 4> kStates = {State::kDisplay, State::kCharge, State::kCamera,
                                                 State::kCall};

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
