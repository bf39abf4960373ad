#include "day/Notes.h"

#include "base/Calendar.h"

namespace day {

using trace::Bound;

void Notes::take(const trace::Note& note, int64_t at) {
    if (note.capture) {
        capture = note.capture;
        firstDay = base::parseDate(note.capture->midnight.value_or(""));
    }
    if (note.sensors) {
        namesSensors = true;
        sensors = *note.sensors;
        mByHandle.clear();
        for (size_t i = 0; i < sensors.size(); ++i) mByHandle.emplace(sensors[i].handle, i);
    }
    for (const trace::UidPackages& each : note.packages) packages[each.uid] = each.names;
    if (note.known) {
        known = note.known;
        displayKnown = spansOf(note.known->display);
    }
    gaps.insert(gaps.end(), note.gaps.begin(), note.gaps.end());
    if (note.taken) {
        taken = note.taken;
        takenAt = at;
    }
    if (note.lost) lost.push_back(*note.lost);
}

void Notes::startClock() {
    Notes kept;
    kept.namesSensors = namesSensors;
    kept.sensors = std::move(sensors);
    kept.mByHandle = std::move(mByHandle);
    kept.packages = std::move(packages);
    *this = std::move(kept);
}

std::optional<int64_t> Notes::knownTo() const {
    if (capture) return toClock(capture->knownTo);
    return taken ? std::optional(takenAt) : std::nullopt;
}

bool Notes::isAhead(int64_t at) const {
    return capture && isBehind(at) &&
           (capture->bound == Bound::kStamp || capture->bound == Bound::kCapturedAt);
}

const trace::Sensor* Notes::sensorOf(uint32_t handle) const {
    const auto found = mByHandle.find(handle);
    return found == mByHandle.end() ? nullptr : &sensors[found->second];
}

const trace::Sensor* Notes::sensorOf(const trace::ChargeRow& row) const {
    return row.handle < 0 ? nullptr : sensorOf(static_cast<uint32_t>(row.handle));
}

std::string Notes::nameOf(const trace::ChargeRow& row) const {
    if (row.handle == trace::kGpsHandle) return "GPS";
    const trace::Sensor* sensor = sensorOf(row);
    return sensor == nullptr ? std::string() : sensor->name;
}

const std::vector<std::string>& Notes::packagesOf(int32_t uid) const {
    static const std::vector<std::string> kNone;
    const auto found = packages.find(uid);
    return found == packages.end() ? kNone : found->second;
}

void Notes::complete(Holder* holder) const {
    if (const auto* sensor = holder->handle ? sensorOf(*holder->handle) : nullptr) {
        holder->sensor = sensor->name;
        holder->type = sensor->type;
        holder->mode = sensor->mode;
        holder->wakeUp = sensor->wakeUp;
        holder->maxRate = sensor->maxRate;
    }
    if (holder->uid) holder->packages = packagesOf(*holder->uid);
}

Holder Notes::holderOf(const trace::Client& client) const {
    Holder holder;
    holder.pkg = client.pkg;
    holder.opPkg = client.pkg;
    holder.uid = client.uid;
    holder.handle = client.handle;
    complete(&holder);
    return holder;
}

}  // namespace day
