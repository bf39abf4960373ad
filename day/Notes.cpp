#include "day/Notes.h"

#include <algorithm>

#include "base/Calendar.h"
#include "trace/TraceTime.h"

namespace day {

using trace::Bound;

int64_t toClock(int64_t ms) {
    return std::clamp<int64_t>(ms, 0, trace::kMaxTimeMs) * base::kNsPerMs;
}

std::vector<Span> spansOf(const std::vector<trace::Interval>& intervals) {
    std::vector<Span> spans;
    int64_t end = 0;
    for (const trace::Interval& each : intervals) {
        const Span span{std::max(toClock(each.from), end), toClock(each.to)};
        if (span.from >= span.to) continue;
        spans.push_back(span);
        end = span.to;
    }
    return spans;
}

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
