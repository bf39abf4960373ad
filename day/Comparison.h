#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "base/Calendar.h"
#include "day/Profile.h"

namespace day {

/** Values of several inputs, of one kind: the middle one, the smallest and the largest. */
struct Spread {
    double median = 0;
    double smallest = 0;
    double largest = 0;
};

/** What a difference comes with. */
enum class Factor {
    kUseLength,   // a use takes longer
    kEnables,     // there are more of them
    kRate,        // it is faster
    kBatching,    // there is less of it
    kDisplayOff,  // it takes a larger share of the time
    kBackground,  // it takes a larger share of the time
};

/** A factor that went the way of the difference. */
struct Change {
    Factor factor;
    bool isMore;  // as the factor says; false: the reverse
};

enum class ChangeState {
    kChanged,
    kNew,         // not there before
    kGone,        // not there afterwards
    kNotCovered,  // one side does not cover enough to tell
};

/** How an app's time with a type of sensor differs; seconds per hour of what `per` says. */
struct Difference {
    ProfileKey key;
    std::string sensor;  // a name of it; may be empty
    Per per;
    ChangeState state;
    std::optional<Spread> before;  // nothing if nothing at all is covered
    std::optional<Spread> after;
    double size = 0;  // median after less median before; 0 if that is not covered
    std::vector<Change> changes;
};

/** What two sides have of something. */
template <typename Value>
struct Sides {
    std::optional<Value> before;
    std::optional<Value> after;
};

/** Two sides, held against each other: of equal ones nothing is left. */
struct Comparison {
    std::vector<Difference> differences;  // the largest first

    // Of the last input of each side.
    std::map<std::pair<std::string, int32_t>, Sides<trace::Sensor>> sensors;  // by name and type
    std::map<std::string, Sides<std::string>> properties;

    std::array<bool, kPers> isCovered{};  // by Per: on both sides
};

/** Less than this on a side is not enough to call a difference a change, ns. */
inline constexpr int64_t kLeastCoverage = 10 * base::kMsPerMinute * base::kNsPerMs;

/** A factor explains a difference if it is larger by this share at least. */
inline constexpr double kLeastFactor = 1.1;

/** Each side has an input at least. */
Comparison compare(const std::vector<Profile>& before, const std::vector<Profile>& after);

}  // namespace day
