#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "day/Journal.h"

namespace day {

/** By what a time for which a sensor was held is divided, so that days can be compared. */
enum class Per {
    kHour,     // that is covered
    kOffHour,  // that is covered with the display off
    kBattery,  // hour on battery since the last charge, by the battery statistics
};

inline constexpr size_t kPers = 3;

/** An app's uses of the sensors of one type in one input. Times are nanoseconds. */
struct ProfileRow {
    std::string sensor;  // a name of it; empty if none is known
    int64_t held = 0;
    int64_t displayKnown = 0;  // of `held`
    int64_t heldOff = 0;       // of `displayKnown`, with the display off
    int64_t uses = 0;
    int64_t enables = 0;
    std::optional<int64_t> periodNs;  // the shortest
    std::optional<int64_t> batchUs;   // the shortest; the longest possible is -1
    int64_t heldOnBattery = 0;        // since the last charge
    int64_t background = 0;           // of `heldOnBattery`
};

/**
 * An app, by its first package where that is known, else by its clients' tag without what changes
 * from build to build ("$1" at its end); and a type of sensor: none for GPS, 0 if it is not known.
 */
using ProfileKey = std::pair<std::string, std::optional<int32_t>>;

/** What one input says of each app, made to be compared with another one. */
struct Profile {
    std::string name;          // of the input
    int64_t covered = 0;       // ns: seen, without gaps
    int64_t displayKnown = 0;  // of `covered`
    int64_t displayOff = 0;    // of `displayKnown`
    int64_t onBattery = 0;     // ns, of the battery statistics
    std::map<ProfileKey, ProfileRow> rows;
    std::vector<trace::Sensor> sensors;
    std::map<std::string, std::string> properties;

    /** How long is covered for `per`, ns. */
    int64_t coverage(Per per) const;
};

/** Adds another row of the same key. */
void add(const ProfileRow& other, ProfileRow* row);

/** How long a row was held in what `per` divides by, ns. */
int64_t heldPer(const ProfileRow& row, Per per);

Profile profileOf(const Journal& journal);

}  // namespace day
