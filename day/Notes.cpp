#include "day/Notes.h"

#include "base/Calendar.h"

namespace day {

using trace::Bound;

void Notes::take(const trace::Note& note, int64_t at) {
    if (note.capture) {
        mCapture = note.capture;
        mKnownTo = toClock(note.capture->knownTo);
        mFirstDay = base::parseDate(note.capture->midnight.value_or(""));
    }
    if (note.sensors) {
        mNamesSensors = true;
        mSensors = *note.sensors;
        mByHandle.clear();
        for (size_t i = 0; i < mSensors.size(); ++i) mByHandle.emplace(mSensors[i].handle, i);
    }
    for (const trace::UidPackages& each : note.packages) mPackages[each.uid] = each.names;
    if (note.known) {
        mKnown = note.known;
        mDisplayKnown = spansOf(note.known->display);
    }
    mGaps.insert(mGaps.end(), note.gaps.begin(), note.gaps.end());
    if (note.taken) {
        mTaken = note.taken;
        mTakenAt = at;
    }
    if (note.lost) mLost.push_back(*note.lost);
}

void Notes::startClock() {
    Notes kept;
    kept.mNamesSensors = mNamesSensors;
    kept.mSensors = std::move(mSensors);
    kept.mByHandle = std::move(mByHandle);
    kept.mPackages = std::move(mPackages);
    *this = std::move(kept);
}

bool Notes::isAhead(int64_t at) const {
    return mCapture && at > *mKnownTo &&
           (mCapture->bound == Bound::kStamp || mCapture->bound == Bound::kCapturedAt);
}

const trace::Sensor* Notes::sensorOf(uint32_t handle) const {
    const auto found = mByHandle.find(handle);
    return found == mByHandle.end() ? nullptr : &mSensors[found->second];
}

const trace::Sensor* Notes::sensorOf(const trace::ChargeRow& row) const {
    return row.handle < 0 ? nullptr : sensorOf(static_cast<uint32_t>(row.handle));
}

std::string Notes::nameOf(const trace::ChargeRow& row) const {
    if (row.handle == trace::kGpsHandle) return "GPS";
    const trace::Sensor* sensor = sensorOf(row);
    return sensor == nullptr ? std::string() : sensor->name;
}

const std::vector<std::string>* Notes::packagesOf(int32_t uid) const {
    const auto found = mPackages.find(uid);
    return found == mPackages.end() ? nullptr : &found->second;
}

void Notes::complete(Holder* holder) const {
    if (const auto* sensor = holder->handle ? sensorOf(*holder->handle) : nullptr) {
        holder->sensor = sensor->name;
        holder->type = sensor->type;
        holder->mode = sensor->mode;
        holder->wakeUp = sensor->wakeUp;
        holder->maxRate = sensor->maxRate;
    }
    if (const auto* packages = holder->uid ? packagesOf(*holder->uid) : nullptr) {
        holder->packages = *packages;
    }
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
