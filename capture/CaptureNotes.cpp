#include "capture/CaptureNotes.h"

#include <algorithm>
#include <set>
#include <utility>

#include "base/Calendar.h"
#include "capture/Refusals.h"

namespace capture {

namespace {

trace::CaptureNote captureNote(const JoinedDay& day) {
    trace::CaptureNote capture;
    std::optional<int64_t> taken;
    for (const JoinedDump& dump : day.joined.dumps) {
        capture.files.push_back(day.dumps[dump.dump].name);
        taken = std::max(taken, day.dumps[dump.dump].dump.taken());
    }
    if (taken) capture.taken = base::formatStamp(*taken);
    if (day.dating.firstDay) capture.midnight = base::formatDate(*day.dating.firstDay);
    capture.registrations =
            std::count_if(day.steps.begin(), day.steps.end(),
                          [](const UseStep& step) { return step.kind == UseStep::Kind::kLine; });
    capture.from = day.dating.times.front();
    capture.to = day.dating.times.back();
    capture.knownTo = day.knownEnd.at;
    capture.bound = day.knownEnd.bound;
    capture.warnings = day.warnings;
    return capture;
}

trace::KnownStates knownStates(const JoinedDay& day) {
    const auto from = [&](State state) {
        std::vector<trace::Interval> known;
        for (const trace::Interval& interval : day.states.known(state)) {
            const int64_t begin = std::max(day.dating.traceTime(interval.from), day.start);
            const int64_t end = day.dating.traceTime(interval.to);
            if (begin < end) known.push_back({begin, end});
        }
        return known;
    };
    return {from(State::kDisplay), from(State::kCharge), from(State::kCamera), from(State::kCall)};
}

/** Of the uids that the trace names. */
std::vector<trace::UidPackages> packagesOf(const JoinedDay& day, const trace::TakenNote& taken) {
    std::set<int32_t> uids;
    const auto add = [&](const std::optional<int32_t>& uid) {
        if (uid) uids.insert(*uid);
    };
    for (size_t client = 0; client < day.clients.size(); ++client) add(day.clients[client].uid);
    if (taken.connections) {
        for (const trace::Connection& connection : *taken.connections) add(connection.client.uid);
    }
    for (const trace::DirectChannel& channel : taken.direct) add(channel.uid);
    for (const trace::RefusedNote& refused : taken.refused) add(refused.client.uid);
    if (taken.sinceCharge) {
        for (const trace::ChargeRow& row : taken.sinceCharge->rows) add(row.uid);
    }
    std::vector<trace::UidPackages> packages;
    for (const int32_t uid : uids) {
        trace::UidPackages entry{uid, {}};
        for (const Part& part : day.parts) {
            const auto found = part.dump->statistics.packages().find(uid);
            if (found == part.dump->statistics.packages().end()) continue;
            for (const std::string& name : found->second) {
                auto& names = entry.names;
                if (std::find(names.begin(), names.end(), name) == names.end()) {
                    names.push_back(name);
                }
            }
        }
        if (!entry.names.empty()) packages.push_back(std::move(entry));
    }
    return packages;
}

/** Adds a connection to one of its sensors; those of one client are one entry. */
void addConnection(const ClientConnection& connection, const trace::Client& client,
                   std::vector<trace::Connection>* all) {
    const auto isSame = [&](const trace::Connection& known) { return known.client == client; };
    const auto known = std::find_if(all->begin(), all->end(), isSame);
    if (known == all->end()) {
        all->push_back({client, 1, connection.hasAccess, connection.wakeLocks});
        return;
    }
    ++known->count;
    if (connection.hasAccess) {
        known->hasAccess = *connection.hasAccess && known->hasAccess.value_or(true);
    }
    if (connection.wakeLocks) {
        known->wakeLocks = *connection.wakeLocks + known->wakeLocks.value_or(0);
    }
}

}  // namespace

trace::Note headNote(const JoinedDay& day) {
    trace::Note note;
    note.capture = captureNote(day);
    note.sensors = day.sensors.sensors();
    note.packages = packagesOf(day, *takenNote(day).taken);
    if (day.dating.firstDay) note.known = knownStates(day);
    for (const size_t line : day.joined.gaps) {
        note.gaps.push_back({day.dating.times[line - 1], day.dating.times[line]});
    }
    return note;
}

trace::Note takenNote(const JoinedDay& day) {
    trace::TakenNote taken;
    const Dump& dump = *day.parts.back().dump;
    if (const auto& connections = dump.service.connections) {
        taken.connections.emplace();
        for (const ClientConnection& connection : connections->all()) {
            for (const uint32_t handle : connection.handles) {
                const auto client = day.clients.clientOf(connection, handle, day.parts.size() - 1);
                addConnection(connection, client, &*taken.connections);
            }
        }
        taken.operatingMode = connections->operatingMode();
    }
    taken.direct = dump.service.direct.channels();
    taken.refused = refusalsOf(day.dumps, day.joined);
    if (dump.statistics.hasLines()) taken.sinceCharge = dump.statistics.sinceCharge();
    trace::Note note;
    note.taken = std::move(taken);
    return note;
}

}  // namespace capture
