#include "day/Comparison.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <limits>
#include <set>
#include <tuple>
#include <utility>

namespace day {

namespace {

using Side = std::vector<Profile>;

constexpr std::array<Per, kPers> kAll = {Per::kHour, Per::kOffHour, Per::kBattery};
constexpr double kSecondsPerHour = 3600;
constexpr double kLeastDifference = 0.001;  // seconds per hour; less is rounding

const ProfileRow& rowOf(const Profile& profile, const ProfileKey& key) {
    static const ProfileRow kNone;
    const auto found = profile.rows.find(key);
    return found == profile.rows.end() ? kNone : found->second;
}

bool isCovered(const Profile& profile, Per per) {
    return profile.coverage(per) >= kLeastCoverage;
}

bool isCovered(const Side& side, Per per) {
    return std::any_of(side.begin(), side.end(),
                       [per](const Profile& each) { return isCovered(each, per); });
}

/** By the inputs that cover enough; where none does, by all that cover anything. */
std::optional<Spread> spreadOf(const Side& side, const ProfileKey& key, Per per) {
    const bool wantsEnough = isCovered(side, per);
    std::vector<double> values;
    for (const Profile& profile : side) {
        const int64_t coverage = profile.coverage(per);
        if (coverage <= 0 || (wantsEnough && !isCovered(profile, per))) continue;
        values.push_back(static_cast<double>(rowOf(profile, key).heldPer(per)) /
                         static_cast<double>(coverage) * kSecondsPerHour);
    }
    if (values.empty()) return std::nullopt;
    std::sort(values.begin(), values.end());
    const size_t half = values.size() / 2;
    const double median =
            values.size() % 2 == 1 ? values[half] : (values[half - 1] + values[half]) / 2;
    return Spread{median, values.front(), values.back()};
}

/** A key's uses in all inputs of a side. */
struct SideSum {
    ProfileRow row;
    double covered = 0;  // ns
};

SideSum sumOf(const Side& side, const ProfileKey& key) {
    SideSum sum;
    for (const Profile& profile : side) {
        sum.covered += static_cast<double>(profile.covered);
        sum.row.add(rowOf(profile, key));
    }
    return sum;
}

double ratio(double part, double whole) {
    return whole > 0 ? part / whole : 0;
}

double ratio(int64_t part, int64_t whole) {
    return ratio(static_cast<double>(part), static_cast<double>(whole));
}

/** The shortest period as a rate; without one 0. */
double rateOf(const ProfileRow& row) {
    if (!row.periodNs) return 0;
    if (*row.periodNs <= 0) return std::numeric_limits<double>::infinity();
    return 1 / static_cast<double>(*row.periodNs);
}

/** How little is batched: the larger, the more often the processor wakes. */
double unbatchedness(const ProfileRow& row) {
    if (!row.batchUs || *row.batchUs < 0) return 0;
    return 1 / (1 + static_cast<double>(*row.batchUs));
}

std::vector<Change> changesOf(const SideSum& before, const SideSum& after, Per per, double size) {
    std::vector<Change> changes;
    const auto look = [&](Factor factor, double old, double now) {
        const bool isMore = now > old;
        const bool isLarge = std::max(old, now) >= kLeastFactor * std::min(old, now);
        if (old == now || !isLarge || (size != 0 && isMore != (size > 0))) return;
        changes.push_back({factor, isMore});
    };
    const ProfileRow& a = before.row;
    const ProfileRow& b = after.row;
    if (per == Per::kBattery) {
        look(Factor::kBackground, ratio(a.background, a.heldOnBattery),
             ratio(b.background, b.heldOnBattery));
        return changes;
    }
    look(Factor::kUseLength, ratio(a.held, a.uses), ratio(b.held, b.uses));
    look(Factor::kEnables, ratio(static_cast<double>(a.enables), before.covered),
         ratio(static_cast<double>(b.enables), after.covered));
    if (a.periodNs && b.periodNs) look(Factor::kRate, rateOf(a), rateOf(b));
    if (a.batchUs && b.batchUs) look(Factor::kBatching, unbatchedness(a), unbatchedness(b));
    if (a.display.known > 0 && b.display.known > 0) {
        look(Factor::kDisplayOff, ratio(a.display.off(), a.display.known),
             ratio(b.display.off(), b.display.known));
    }
    return changes;
}

bool isRateOrBatching(const Change& change) {
    return change.factor == Factor::kRate || change.factor == Factor::kBatching;
}

/** What differs for a key, if anything does. */
std::optional<Difference> differenceOf(const Side& before, const Side& after, const ProfileKey& key,
                                       Per per) {
    const SideSum sumBefore = sumOf(before, key);
    const SideSum sumAfter = sumOf(after, key);
    ProfileRow both = sumBefore.row;
    both.add(sumAfter.row);
    Difference result{key, both.sensor, per, ChangeState::kChanged, {}, {}, 0, {}};
    result.before = spreadOf(before, key, per);
    result.after = spreadOf(after, key, per);
    const Spread old = result.before.value_or(Spread());
    const Spread now = result.after.value_or(Spread());
    if (old.largest == 0 && now.largest == 0) return std::nullopt;
    const double size = now.median - old.median;
    const bool isSame = std::fabs(size) < kLeastDifference &&
                        std::fabs(now.smallest - old.smallest) < kLeastDifference &&
                        std::fabs(now.largest - old.largest) < kLeastDifference;
    if (!isCovered(before, per) || !isCovered(after, per)) {
        if (isSame) return std::nullopt;
        result.state = ChangeState::kNotCovered;
        return result;
    }
    if (!isSame) result.size = size;
    if (old.largest == 0) {
        result.state = ChangeState::kNew;
    } else if (now.largest == 0) {
        result.state = ChangeState::kGone;
    } else {
        result.changes = changesOf(sumBefore, sumAfter, per, result.size);
        // An app that holds a sensor as long as before, but at another rate, has changed.
        const bool costsOtherwise =
                per == Per::kHour &&
                std::any_of(result.changes.begin(), result.changes.end(), isRateOrBatching);
        if (isSame && !costsOtherwise) return std::nullopt;
    }
    return result;
}

std::set<ProfileKey> keysOf(const Side& before, const Side& after) {
    std::set<ProfileKey> keys;
    for (const Side* side : {&before, &after}) {
        for (const Profile& profile : *side) {
            for (const auto& [key, row] : profile.rows) keys.insert(key);
        }
    }
    return keys;
}

/** All that a person would call the same sensor has. */
auto identityOf(const trace::Sensor& sensor) {
    return std::tie(sensor.mode, sensor.wakeUp, sensor.minRate, sensor.maxRate);
}

bool isSame(const trace::Sensor& a, const trace::Sensor& b) {
    return identityOf(a) == identityOf(b);
}

bool isSame(const std::string& a, const std::string& b) {
    return a == b;
}

template <typename Key, typename Value>
void leaveOutSame(std::map<Key, Sides<Value>>* all) {
    for (auto each = all->begin(); each != all->end();) {
        const auto& [before, after] = each->second;
        each = before && after && isSame(*before, *after) ? all->erase(each) : std::next(each);
    }
}

void compareSensors(const Profile& before, const Profile& after, Comparison* result) {
    // Where one side has no list at all, nothing is known of its sensors.
    if (before.sensors.empty() || after.sensors.empty()) return;
    // Of several that share name and type the first counts.
    for (const trace::Sensor& sensor : before.sensors) {
        auto& old = result->sensors[{sensor.name, sensor.type}].before;
        if (!old) old = sensor;
    }
    for (const trace::Sensor& sensor : after.sensors) {
        auto& now = result->sensors[{sensor.name, sensor.type}].after;
        if (!now) now = sensor;
    }
    leaveOutSame(&result->sensors);
}

void compareProperties(const Profile& before, const Profile& after, Comparison* result) {
    for (const auto& [name, value] : before.properties) result->properties[name].before = value;
    for (const auto& [name, value] : after.properties) result->properties[name].after = value;
    leaveOutSame(&result->properties);
}

}  // namespace

Comparison compare(const Side& before, const Side& after) {
    Comparison result;
    for (const Per per : kAll) {
        result.isCovered[static_cast<size_t>(per)] =
                isCovered(before, per) && isCovered(after, per);
    }
    for (const ProfileKey& key : keysOf(before, after)) {
        for (const Per per : kAll) {
            if (auto difference = differenceOf(before, after, key, per)) {
                result.differences.push_back(std::move(*difference));
            }
        }
    }
    // Stable: the same rows in the same order whichever side comes first.
    std::stable_sort(result.differences.begin(), result.differences.end(),
                     [](const Difference& a, const Difference& b) {
                         return std::fabs(a.size) > std::fabs(b.size);
                     });
    compareSensors(before.back(), after.back(), &result);
    compareProperties(before.back(), after.back(), &result);
    return result;
}

}  // namespace day
