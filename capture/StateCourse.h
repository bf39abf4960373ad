#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "capture/dump/BatteryHistory.h"
#include "capture/dump/EventLog.h"
#include "capture/dump/StateValue.h"

namespace capture {

/** The values that a device's states had over time, as far as they are known. */
class StateCourse {
public:
    /** Adds a value; times must not go back. */
    void add(const StateValue& value) { values(value.state).push_back(value); }

    /** The values of a state in order; before the first nothing is known. */
    const std::vector<StateValue>& of(State state) const {
        return mValues[static_cast<size_t>(state)];
    }

    /** The value that holds in the whole second of `at`, if it is known. */
    std::optional<int> at(State state, int64_t at) const;

private:
    std::vector<StateValue>& values(State state) { return mValues[static_cast<size_t>(state)]; }

    std::array<std::vector<StateValue>, kStates.size()> mValues;
};

/**
 * The course by both sources of a dump: by the history while it records, by the log from its first
 * line on while the history does not. Either may be missing.
 */
StateCourse mergeSources(const BatteryHistory* history, const EventLog* log);

}  // namespace capture
