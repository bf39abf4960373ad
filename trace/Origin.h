#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace trace {

/** An entry of the device's list of sensors. Names are data from outside and may repeat. */
struct Sensor {
    uint32_t handle;
    int32_t type;
    std::string name;
};

/** From `from` up to, but without, `to`; in milliseconds of the trace's clock. */
struct Interval {
    int64_t from;
    int64_t to;
};

/**
 * Where a trace comes from: what a capture, or several merged ones, says of itself beside it. Dates
 * and times of day are local time of the device.
 */
struct Origin {
    std::vector<std::string> files;    // as they were given; in the order of their contents
    std::optional<std::string> taken;  // the newest stamp: "2018-04-25 11:45:34"
    std::optional<int64_t> firstDay;   // of the trace's time 0, in days since 1970-01-01
    Interval registrations{};          // from the oldest to the newest, that one included
    int64_t registrationCount = 0;     // those in the trace
    int64_t knownTo = 0;               // when the capture was taken, ms; or the newest registration
    std::vector<Sensor> sensors;       // in the order of the list
    std::vector<Interval> gaps;        // lines are missing here (merged captures)

    // When the state is known; in order, apart from each other. Empty: never.
    std::vector<Interval> displayKnown;
    std::vector<Interval> chargeKnown;
    std::vector<Interval> cameraKnown;
    std::vector<Interval> callKnown;

    /**
     * The names of a type's sensors, in the order of the list, each once: those that the
     * registrations use, or all of them if they use none. Types that the list lacks are missing.
     */
    std::map<int32_t, std::vector<std::string>> namesOfType;
};

}  // namespace trace
