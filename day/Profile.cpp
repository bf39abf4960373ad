#include "day/Profile.h"

#include <algorithm>

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

void add(const Use& use, Profile* profile) {
    ProfileRow row;
    row.sensor = use.sensor;
    row.held = use.to - use.from;
    row.displayKnown = use.display.known;
    row.heldOff = use.display.off();
    row.uses = 1;
    row.enables = static_cast<int64_t>(use.enables.size());
    row.periodNs = use.periodNs;
    row.batchUs = use.batchUs;
    add(row, &profile->rows[{keyApp(use), use.type}]);
}

void add(const trace::SinceCharge& charge, const Notes& notes, Profile* profile) {
    profile->onBattery += toClock(charge.onBatteryMs.value_or(0));
    for (const trace::ChargeRow& each : charge.rows) {
        const auto& packages = notes.packagesOf(each.uid);
        const trace::Sensor* sensor = notes.sensorOf(each);
        const std::string app =
                packages.empty() ? "uid " + std::to_string(each.uid) : packages.front();
        ProfileRow row;
        row.sensor = notes.nameOf(each);
        row.heldOnBattery = toClock(each.ms);
        row.background = toClock(each.background.value_or(0));
        ProfileKey key{app, sensor == nullptr ? 0 : sensor->type};
        if (each.handle == trace::kGpsHandle) key.second.reset();
        add(row, &profile->rows[key]);
    }
}

}  // namespace

int64_t Profile::coverage(Per per) const {
    return per == Per::kHour ? covered : per == Per::kOffHour ? displayOff : onBattery;
}

void add(const ProfileRow& other, ProfileRow* row) {
    // The same one whatever is added first.
    if (row->sensor.empty() || (!other.sensor.empty() && other.sensor < row->sensor)) {
        row->sensor = other.sensor;
    }
    row->held += other.held;
    row->displayKnown += other.displayKnown;
    row->heldOff += other.heldOff;
    row->uses += other.uses;
    row->enables += other.enables;
    if (other.periodNs) {
        row->periodNs = std::min(row->periodNs.value_or(*other.periodNs), *other.periodNs);
    }
    row->batchUs = shorterBatch(row->batchUs, other.batchUs);
    row->heldOnBattery += other.heldOnBattery;
    row->background += other.background;
}

int64_t heldPer(const ProfileRow& row, Per per) {
    return per == Per::kHour ? row.held : per == Per::kOffHour ? row.heldOff : row.heldOnBattery;
}

Profile profileOf(const Journal& journal) {
    Profile profile;
    profile.name = journal.name;
    profile.properties = journal.properties;
    for (const Use& use : journal.uses) add(use, &profile);
    for (const Boot& boot : journal.boots) {
        profile.covered += lengthOf(boot.seen);
        profile.displayKnown += boot.display.known;
        profile.displayOff += boot.display.off();
    }
    for (const Notes& notes : journal.captures) {
        profile.sensors = notes.sensors;
        if (notes.taken && notes.taken->sinceCharge) {
            add(*notes.taken->sinceCharge, notes, &profile);
        }
    }
    return profile;
}

}  // namespace day
