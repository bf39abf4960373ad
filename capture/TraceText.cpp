#include "capture/TraceText.h"

#include <algorithm>
#include <cstdint>

#include "capture/CaptureNotes.h"
#include "capture/HostDay.h"

namespace capture {

namespace {

// The library tests an app's package. A client's tag is mostly the name of one of its classes.
std::string opPackageOf(const JoinedDay& day, const trace::Client& client, size_t part) {
    if (client.uid == kSystemUid) return "android";
    if (client.uid) {
        const auto& packages = day.parts[part].dump->statistics.packages();
        const auto found = packages.find(*client.uid);
        if (found != packages.end() && found->second.size() == 1) return found->second.front();
    }
    return client.pkg;
}

const trace::Sensor& sensorOf(const JoinedDay& day, uint32_t handle, size_t part) {
    const trace::Sensor* sensor = day.parts[part].dump->service.sensors.find(handle);
    return sensor != nullptr ? *sensor : *day.sensors.find(handle);
}

void writeEnable(const JoinedDay& day, const UseStep& step, EnableCall call,
                 const trace::RegistrationNote& registration, HostDay* host) {
    const trace::Client& client = day.clients[step.client];
    const std::string opPackage = opPackageOf(day, client, step.part);
    call.package = client.pkg;
    call.opPackage = opPackage;
    trace::Note note;
    note.registration = registration;
    note.registration->handle = client.handle;
    note.registration->uid = client.uid;
    host->writeEnable(step.at, call, note);
}

void writeRegistration(const JoinedDay& day, const UseStep& step, HostDay* host) {
    const DumpLine& line = day.joined.lines[step.index];
    const Registration& registration = line.registration;
    const auto& sensors = day.dumps[line.dump].dump.service.sensors;
    EnableCall call;
    call.on = registration.on;
    call.type = sensors.find(registration.handle)->type;
    call.periodUs = registration.periodUs;
    trace::RegistrationNote note;
    note.batchUs = registration.batchUs;
    note.level = step.level;
    writeEnable(day, step, call, note, host);
}

void writeEarlier(const JoinedDay& day, const UseStep& step, HostDay* host) {
    const EarlierEnable& enable = day.levels.earlier[step.part][step.index];
    EnableCall call;
    call.on = true;
    call.type = sensorOf(day, day.clients[step.client].handle, step.part).type;
    call.periodUs = enable.periodUs;
    trace::RegistrationNote note;
    note.batchUs = enable.batchUs;
    note.before = true;
    note.rateKnown = enable.isKnown;
    writeEnable(day, step, call, note, host);
}

void writeStep(const JoinedDay& day, const UseStep& step, int64_t end, HostDay* host) {
    if (step.kind == UseStep::Kind::kLine) return writeRegistration(day, step, host);
    if (step.kind == UseStep::Kind::kEarlier) return writeEarlier(day, step, host);
    trace::Note note;
    note.end = {day.clients[step.client], step.how, {}};
    if (step.at > end) note.end->at = step.at;
    host->writeLine(std::min(step.at, end), note);
}

}  // namespace

std::string traceOf(const JoinedDay& day) {
    std::string trace;
    HostDay host(day.start, &trace);
    host.writeLine(day.start, headNote(day));
    host.writeStart();
    auto change = day.changes.begin();
    const auto writeChangesUpTo = [&](int64_t time) {
        for (; change != day.changes.end() && day.dating.traceTime(change->at) <= time; ++change) {
            host.writeState(day.dating.traceTime(change->at), change->state, change->value);
        }
    };
    int64_t last = day.dating.times.back();
    if (!day.changes.empty()) last = std::max(last, day.dating.traceTime(day.changes.back().at));
    const int64_t end = HostDay::endOf(last);
    for (const UseStep& step : day.steps) {
        writeChangesUpTo(step.at);
        writeStep(day, step, end, &host);
    }
    writeChangesUpTo(INT64_MAX);
    if (day.knownEnd.at <= end) {
        host.writeLine(day.knownEnd.at, takenNote(day));
        host.writeEnd(end);
    } else {
        host.writeLine(end, takenNote(day));
    }
    return trace;
}

}  // namespace capture
