#include "day/Profile.h"

#include <algorithm>

#include "base/Calendar.h"

namespace day {

namespace {

/** A tag without the number that a compiler gives to a class without a name: "$1". */
std::string withoutNumber(const std::string& tag) {
    const size_t dollar = tag.find_last_not_of("0123456789");
    const bool isNumbered =
            dollar != std::string::npos && tag[dollar] == '$' && dollar + 1 < tag.size();
    return isNumbered ? tag.substr(0, dollar) : tag;
}

std::string keyApp(const Use& use) {
    return use.packages.empty() ? withoutNumber(use.pkg) : use.packages.front();
}

/** The shorter batching is the one that costs; -1 is the longest. */
bool isLessBatching(int64_t a, int64_t b) {
    if (a < 0 || b < 0) return b < 0 && a >= 0;
    return a < b;
}

void add(const Use& use, Profile* profile) {
    ProfileRow row;
    row.sensor = use.sensor;
    row.held = use.to - use.from;
    row.displayKnown = use.display.known;
    row.heldOff = use.display.known - use.display.on;
    row.uses = 1;
    row.enables = static_cast<int64_t>(use.enables.size());
    row.periodNs = use.periodNs;
    row.batchUs = use.batchUs;
    add(row, &profile->rows[{keyApp(use), use.type}]);
}

void add(const trace::SinceCharge& charge, const Notes& notes, Profile* profile) {
    profile->onBattery += charge.onBatteryMs.value_or(0) * base::kNsPerMs;
    for (const trace::ChargeRow& each : charge.rows) {
        const auto* packages = notes.packagesOf(each.uid);
        const trace::Sensor* sensor =
                each.handle < 0 ? nullptr : notes.sensorOf(static_cast<uint32_t>(each.handle));
        const std::string app = packages == nullptr || packages->empty()
                                        ? "uid " + std::to_string(each.uid)
                                        : packages->front();
        ProfileRow row;
        if (sensor != nullptr) row.sensor = sensor->name;
        row.heldOnBattery = each.ms * base::kNsPerMs;
        row.background = each.background.value_or(0) * base::kNsPerMs;
        add(row,
            &profile->rows[{app, sensor == nullptr ? std::nullopt : std::optional(sensor->type)}]);
    }
}

}  // namespace

int64_t Profile::coverage(Per per) const {
    return per == Per::kHour ? covered : per == Per::kOffHour ? displayOff : onBattery;
}

void add(const ProfileRow& other, ProfileRow* row) {
    if (row->sensor.empty()) row->sensor = other.sensor;
    row->held += other.held;
    row->displayKnown += other.displayKnown;
    row->heldOff += other.heldOff;
    row->uses += other.uses;
    row->enables += other.enables;
    if (other.periodNs) {
        row->periodNs = std::min(row->periodNs.value_or(*other.periodNs), *other.periodNs);
    }
    if (other.batchUs && (!row->batchUs || isLessBatching(*other.batchUs, *row->batchUs))) {
        row->batchUs = other.batchUs;
    }
    row->heldOnBattery += other.heldOnBattery;
    row->background += other.background;
}

int64_t heldPer(const ProfileRow& row, Per per) {
    return per == Per::kHour ? row.held : per == Per::kOffHour ? row.heldOff : row.heldOnBattery;
}

Profile profileOf(const Journal& journal) {
    Profile profile;
    profile.name = journal.name();
    profile.properties = journal.properties();
    for (const Use& use : journal.uses()) add(use, &profile);
    for (const Boot& boot : journal.boots()) {
        profile.covered += boot.covered;
        profile.displayKnown += boot.display.known;
        profile.displayOff += boot.display.known - boot.display.on;
    }
    for (const Notes& notes : journal.captures()) {
        profile.sensors = notes.sensors();
        if (notes.taken() && notes.taken()->sinceCharge) {
            add(*notes.taken()->sinceCharge, notes, &profile);
        }
    }
    return profile;
}

}  // namespace day
