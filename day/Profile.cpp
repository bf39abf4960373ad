#include "day/Profile.h"

namespace day {

namespace {

/** A tag without the number that a compiler gives to a class without a name: "$1". */
std::string withoutNumber(const std::string& tag) {
    const size_t dollar = tag.find_last_not_of("0123456789");
    const bool isNumbered =
            dollar != std::string::npos && tag[dollar] == '$' && dollar + 1 < tag.size();
    return isNumbered ? tag.substr(0, dollar) : tag;
}

void add(const Use& use, Profile* profile) {
    ProfileRow row;
    row.sensor = use.sensor;
    row.held = use.to - use.from;
    row.display = use.display;
    row.uses = 1;
    row.enables = static_cast<int64_t>(use.enables.size());
    row.periodNs = use.periodNs;
    row.batchUs = use.batchUs;
    const std::string app = use.packages.empty() ? withoutNumber(use.pkg) : use.packages.front();
    profile->rows[{app, std::nullopt, use.type}].add(row);
}

void add(const trace::SinceCharge& charge, const Notes& notes, Profile* profile) {
    profile->onBattery += toClock(charge.onBatteryMs.value_or(0));
    for (const trace::ChargeRow& each : charge.rows) {
        ProfileKey key;
        const auto& packages = notes.packagesOf(each.uid);
        if (packages.empty()) {
            key.uid = each.uid;
        } else {
            key.app = packages.front();
        }
        const trace::Sensor* sensor = notes.sensorOf(each);
        if (each.handle != trace::kGpsHandle) key.type = sensor == nullptr ? 0 : sensor->type;
        ProfileRow row;
        row.sensor = notes.nameOf(each);
        row.heldOnBattery = toClock(each.ms);
        row.background = toClock(each.background.value_or(0));
        profile->rows[key].add(row);
    }
}

}  // namespace

int64_t Profile::coverage(Per per) const {
    return per == Per::kHour ? covered : per == Per::kOffHour ? display.off() : onBattery;
}

void ProfileRow::add(const ProfileRow& more) {
    Total::add(more);
    // The same one whatever is added first.
    if (sensor.empty() || (!more.sensor.empty() && more.sensor < sensor)) sensor = more.sensor;
    uses += more.uses;
    heldOnBattery += more.heldOnBattery;
    background += more.background;
}

int64_t ProfileRow::heldPer(Per per) const {
    return per == Per::kHour ? held : per == Per::kOffHour ? display.off() : heldOnBattery;
}

Profile profileOf(const Journal& journal) {
    Profile profile;
    profile.name = journal.name;
    profile.properties = journal.properties;
    for (const Use& use : journal.uses) add(use, &profile);
    for (const Boot& boot : journal.boots) {
        profile.covered += lengthOf(boot.seen);
        profile.display.add(boot.display);
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
