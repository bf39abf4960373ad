#include "capture/CaptureOrigin.h"

#include <algorithm>
#include <set>
#include <string>

#include "capture/WallTime.h"

namespace capture {

namespace {

/** The sensors that registrations use, and the lines in which they do. */
struct Use {
    std::set<uint32_t> handles;
    std::set<int32_t> types;
    int64_t lines = 0;
};

Use useOf(const std::vector<Source>& sources, const JoinedLines& joined) {
    Use use;
    for (const DumpLine& line : joined.lines) {
        const uint32_t handle = line.registration.handle;
        const auto type = sources[line.dump].dump.sensors.typeOf(handle);
        if (!type) continue;
        use.handles.insert(handle);
        use.types.insert(*type);
        ++use.lines;
    }
    return use;
}

/** Returns when the newest of them was taken. */
std::optional<int64_t> addFiles(const std::vector<Source>& sources, const JoinedLines& joined,
                                trace::Origin* origin) {
    std::optional<int64_t> taken;
    for (const JoinedDump& dump : joined.dumps) {
        origin->files.push_back(sources[dump.dump].name);
        taken = std::max(taken, sources[dump.dump].dump.taken());
    }
    if (taken) origin->taken = formatStamp(*taken);
    return taken;
}

void addSensors(const std::vector<Source>& sources, const JoinedLines& joined,
                trace::Origin* origin) {
    SensorList sensors;
    for (const JoinedDump& dump : joined.dumps) sensors.add(sources[dump.dump].dump.sensors);
    origin->sensors = sensors.sensors();
}

void addNames(const Use& use, trace::Origin* origin) {
    for (const trace::Sensor& sensor : origin->sensors) {
        if (use.types.count(sensor.type) > 0 && use.handles.count(sensor.handle) == 0) continue;
        auto& names = origin->namesOfType[sensor.type];
        if (std::find(names.begin(), names.end(), sensor.name) == names.end()) {
            names.push_back(sensor.name);
        }
    }
}

std::vector<trace::Interval> knownFrom(int64_t start, const Dating& dating,
                                       const std::vector<trace::Interval>& wallTimes) {
    std::vector<trace::Interval> known;
    for (const trace::Interval& interval : wallTimes) {
        const int64_t from = std::max(dating.traceTime(interval.from), start);
        const int64_t to = dating.traceTime(interval.to);
        if (from < to) known.push_back({from, to});
    }
    return known;
}

}  // namespace

trace::Origin originOf(const std::vector<Source>& sources, const JoinedLines& joined,
                       const Dating& dating, const StateStretches& states, int64_t start) {
    trace::Origin origin;
    const auto taken = addFiles(sources, joined, &origin);
    origin.firstDay = dating.firstDay;
    origin.registrations = {dating.times.front(), dating.times.back()};
    origin.knownTo = origin.registrations.to;
    if (taken && dating.firstDay) {
        origin.knownTo = std::max(origin.knownTo, dating.traceTime(*taken));
    }
    const Use use = useOf(sources, joined);
    origin.registrationCount = use.lines;
    addSensors(sources, joined, &origin);
    addNames(use, &origin);
    for (const size_t line : joined.gaps) {
        origin.gaps.push_back({dating.times[line - 1], dating.times[line]});
    }
    if (!dating.firstDay) return origin;
    origin.displayKnown = knownFrom(start, dating, states.known(State::kDisplay));
    origin.chargeKnown = knownFrom(start, dating, states.known(State::kCharge));
    origin.cameraKnown = knownFrom(start, dating, states.known(State::kCamera));
    origin.callKnown = knownFrom(start, dating, states.known(State::kCall));
    return origin;
}

}  // namespace capture
