#include "capture/ClientTable.h"

#include <algorithm>

namespace capture {

ClientTable::ClientTable(const std::vector<NamedDump>& dumps, const JoinedLines& joined,
                         const std::vector<Part>& parts)
      : mOfLine(joined.lines.size()) {
    Holders holders;
    for (const Part& part : parts) {
        readTags(part);
        readLines(dumps, joined, part, &holders);
        readConnections(part);
    }
}

int64_t ClientTable::connectionsOf(size_t client, size_t part) const {
    const auto found = mConnections[part].find(client);
    return found == mConnections[part].end() ? 0 : found->second;
}

// Where a tag's connections are of several uids, nothing tells whose a line without a uid is. Such
// lines are one client then, and the connections on its sensor are its.
trace::Client ClientTable::clientOf(const ClientConnection& connection, uint32_t handle,
                                    size_t part) const {
    trace::Client client{connection.tag, connection.uid, handle};
    const bool differ = !mUids[part].at(connection.tag);
    if (differ && mBare[part].count({handle, connection.tag}) > 0) client.uid.reset();
    return client;
}

size_t ClientTable::numberOf(const trace::Client& client) {
    const auto [entry, isNew] =
            mNumbers.try_emplace({client.pkg, client.uid, client.handle}, mClients.size());
    if (isNew) mClients.push_back(client);
    return entry->second;
}

void ClientTable::readTags(const Part& part) {
    auto& uids = mUids.emplace_back();
    mBare.emplace_back();
    if (!part.dump->service.connections) return;
    for (const ClientConnection& connection : part.dump->service.connections->all()) {
        const auto [entry, isNew] = uids.try_emplace(connection.tag, connection.uid);
        if (!isNew && entry->second != connection.uid) entry->second.reset();
    }
}

void ClientTable::readLines(const std::vector<NamedDump>& dumps, const JoinedLines& joined,
                            const Part& part, Holders* holders) {
    const auto& uids = mUids.back();
    for (size_t i = part.first; i < part.end; ++i) {
        const DumpLine& line = joined.lines[i];
        const Registration& registration = line.registration;
        if (dumps[line.dump].dump.service.sensors.find(registration.handle) == nullptr) continue;
        const std::tuple place(registration.handle, registration.package);
        auto uid = registration.uid;
        if (!uid) {
            const auto tag = uids.find(registration.package);
            if (tag != uids.end()) uid = tag->second;
            mBare.back().insert(place);
        }
        uid = takeHolder(registration.on, uid, i, &(*holders)[place]);
        mOfLine[i] = numberOf({registration.package, uid, registration.handle});
    }
}

// On devices of some makers the system switches off what apps have switched on, in the apps' names
// but with its own uid. Such a line means the app.
std::optional<int32_t> ClientTable::takeHolder(bool on, std::optional<int32_t> uid, size_t line,
                                               std::vector<Holder>* holders) {
    const auto holderOf = [&](const std::optional<int32_t>& wanted) {
        return std::find_if(holders->begin(), holders->end(),
                            [&](const Holder& holder) { return holder.uid == wanted; });
    };
    auto own = holderOf(uid);
    if (own == holders->end()) own = holders->insert(own, Holder{uid});
    if (on) {
        ++own->level;
        own->switchedOn = line;
        return uid;
    }
    if (uid == kSystemUid && own->level == 0) {
        const auto newest = std::max_element(holders->begin(), holders->end(),
                                             [](const Holder& a, const Holder& b) {
                                                 return std::tuple(a.level > 0, a.switchedOn) <
                                                        std::tuple(b.level > 0, b.switchedOn);
                                             });
        if (newest->level > 0) own = newest;
    }
    own->level = std::max<int64_t>(own->level - 1, 0);
    return own->uid;
}

void ClientTable::readConnections(const Part& part) {
    const size_t number = mConnections.size();
    auto& counts = mConnections.emplace_back();
    auto& connected = mConnected.emplace_back();
    if (!part.dump->service.connections) return;
    for (const ClientConnection& connection : part.dump->service.connections->all()) {
        for (const uint32_t handle : connection.handles) {
            if (part.dump->service.sensors.find(handle) == nullptr) continue;
            const size_t client = numberOf(clientOf(connection, handle, number));
            if (counts[client]++ == 0) connected.push_back(client);
        }
    }
}

}  // namespace capture
