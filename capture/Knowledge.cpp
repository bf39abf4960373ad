#include "capture/Knowledge.h"

#include <algorithm>
#include <optional>
#include <string>

#include "capture/dump/WallTime.h"

namespace capture {

namespace {

constexpr int64_t kTolerance = kMsPerSecond;  // by which an event may follow the dump's stamp

/** The moment with this time of day that is nearest to `time`. */
int64_t nearest(int64_t timeOfDay, int64_t time) {
    return wholeUnits(time - timeOfDay + kMsPerDay / 2, kMsPerDay) * kMsPerDay + timeOfDay;
}

/** The last moment with this time of day that is not after `time`. */
int64_t lastUpTo(int64_t timeOfDay, int64_t time) {
    return wholeUnits(time - timeOfDay, kMsPerDay) * kMsPerDay + timeOfDay;
}

/**
 * "Captured at" follows the newest registration as a further line would: a fall of the time of day
 * by an hour or less is a clock that was set back.
 */
int64_t capturedAt(int64_t timeOfDay, const Dating& dating, size_t newestLine) {
    const int64_t printed = dating.printed[newestLine];
    const int64_t next = lastUpTo(timeOfDay, printed + kMsPerDay - 1);
    const bool isSetBack = printed + kMsPerDay - next <= kMsPerHour;
    return std::max(isSetBack ? printed : next, dating.times[newestLine]);
}

/** When the dump was taken, by what it says of itself. */
std::optional<KnownEnd> takenAt(const Dump& dump, const Dating& dating, size_t newestLine) {
    if (const auto& footer = dump.service.footer) {
        return KnownEnd{dating.traceTime(*footer), trace::Bound::kStamp};
    }
    if (const auto& captured = dump.service.capturedAt) {
        return KnownEnd{capturedAt(*captured, dating, newestLine), trace::Bound::kCapturedAt};
    }
    return std::nullopt;
}

/**
 * The newest event's moment. Events print a time of day only. The newest one came just before the
 * dump was taken, or else not far from the newest registration.
 */
std::optional<int64_t> newestEvent(const Dump& dump, const Dating& dating, size_t newestLine) {
    const auto& newest = dump.service.events.newest();
    if (!newest) return std::nullopt;
    const int64_t second = cutToSecond(newest->timeOfDay);
    const auto taken = takenAt(dump, dating, newestLine);
    const int64_t at = taken ? lastUpTo(second, taken->at + kTolerance)
                             : nearest(second, dating.times[newestLine]);
    return at - second + newest->timeOfDay;
}

}  // namespace

KnownEnd knownEnd(const Dump& dump, const Dating& dating, size_t newestLine) {
    const int64_t newest = dating.times[newestLine];
    if (auto taken = takenAt(dump, dating, newestLine)) {
        taken->at = std::max(taken->at, newest);
        return *taken;
    }
    KnownEnd end{newest, trace::Bound::kRegistration};
    if (dump.header && dating.traceTime(*dump.header) >= end.at) {
        end = {dating.traceTime(*dump.header), trace::Bound::kHeader};
    }
    const auto event = newestEvent(dump, dating, newestLine);
    if (event && cutToSecond(*event) > end.at) end = {cutToSecond(*event), trace::Bound::kEvent};
    return end;
}

// All other events are as much older than the newest as the clock says that counts from the boot.
// It gives the day; the time of day is printed.
std::vector<Firing> firingsOf(const Dump& dump, const Dating& dating, size_t newestLine) {
    std::vector<Firing> firings;
    const auto newest = newestEvent(dump, dating, newestLine);
    if (!newest) return firings;
    const int64_t end = knownEnd(dump, dating, newestLine).at;
    const RecentEvents& events = dump.service.events;
    // Sensors of one name share a list; the first one-shot of the name is taken to be meant.
    for (const auto& [name, list] : events.lists()) {
        const trace::Sensor* sensor = dump.service.sensors.findOneShot(name);
        if (sensor == nullptr) continue;
        for (const RecentEvent& event : list) {
            const int64_t age = events.newest()->sinceBoot - event.sinceBoot;
            const int64_t at = nearest(event.timeOfDay, *newest - age);
            if (cutToSecond(at) <= end) firings.push_back({at, sensor->handle});
        }
    }
    return firings;
}

}  // namespace capture
