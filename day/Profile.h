#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <tuple>
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
struct ProfileRow : Total {
    std::string sensor;  // a name of it; empty if none is known
    int64_t uses = 0;
    int64_t heldOnBattery = 0;  // since the last charge
    int64_t background = 0;     // of `heldOnBattery`

    /** Adds another row of the same key. */
    void add(const ProfileRow& more);

    /** How long it was held in what `per` divides by, ns. */
    int64_t heldPer(Per per) const;
};

/** An app and a type of sensor, by what stays the same from one input to another. */
struct ProfileKey {
    /**
     * The app: its first package where that is known, else its clients' tag without what changes
     * from build to build ("$1" at its end).
     */
    std::string app;
    std::optional<int32_t> uid;   // instead of `app`, where nothing names it
    std::optional<int32_t> type;  // of the sensor: none for GPS, 0 if it is not known

    bool operator<(const ProfileKey& other) const {
        return std::tie(app, uid, type) < std::tie(other.app, other.uid, other.type);
    }
};

/** What one input says of each app, made to be compared with another one. */
struct Profile {
    std::string name;       // of the input
    int64_t covered = 0;    // ns: seen, without gaps
    DisplayTime display;    // within `covered`
    int64_t onBattery = 0;  // ns, of the battery statistics
    std::map<ProfileKey, ProfileRow> rows;
    std::vector<trace::Sensor> sensors;
    std::map<std::string, std::string> properties;

    /** How long is covered for `per`, ns. */
    int64_t coverage(Per per) const;
};

Profile profileOf(const Journal& journal);

}  // namespace day
