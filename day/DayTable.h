#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <vector>

#include "day/Use.h"
#include "day/UseTracker.h"

namespace day {

/** A day of one boot: the clock starts again with each boot of the device. */
struct Day {
    int64_t boot;    // the first is 0
    int64_t number;  // since the midnight of the clock's 0

    bool operator<(const Day& other) const {
        return boot != other.boot ? boot < other.boot : number < other.number;
    }
};

/** How a client used a sensor on one day. */
struct DayRow : Total {
    enum class State {
        kOff,
        kOn,     // when the day, or what is known, ended
        kFired,  // a one-shot sensor: it switched itself off
    };

    Holder holder;
    std::optional<double> samples;  // of a continuous sensor; nothing if a rate is not known
    bool isBefore = false;          // a use began earlier than what is seen
    bool isUnseen = false;          // the end of a use was not seen: it was held shorter
    State state = State::kOff;      // of the last use
};

/** Who used which sensor, day by day. */
class DayTable {
public:
    /** Adds a use, of which `tracker` has just told. */
    void add(const Use& use, const UseTracker& tracker);

    /** The days that have a use, in order. */
    std::vector<Day> days() const;

    /**
     * The rows of a day by what they cost: first continuous sensors by their samples, where those
     * come first whose samples are not known, then all others by the time held.
     */
    std::vector<DayRow> rowsOf(const Day& day) const;

private:
    std::map<Day, std::map<HolderKey, DayRow>> mRows;
};

}  // namespace day
