#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "capture/DumpJoin.h"
#include "capture/NamedDump.h"
#include "capture/Part.h"
#include "trace/Note.h"

namespace capture {

inline constexpr int32_t kSystemUid = 1000;

/**
 * Tells to which client each registration and each connection belongs. A client is a tag with its
 * uid, on one sensor.
 * Clients are numbered in the order in which they come.
 */
class ClientTable {
public:
    ClientTable() = default;
    ClientTable(const std::vector<NamedDump>& dumps, const JoinedLines& joined,
                const std::vector<Part>& parts);

    size_t size() const { return mClients.size(); }
    const trace::Client& operator[](size_t client) const { return mClients[client]; }

    /** The client of a line; nothing if its sensor is not in its dump's list. */
    const std::optional<size_t>& ofLine(size_t line) const { return mOfLine[line]; }

    /** The clients that a part's dump has connections of, in the printed order; each once. */
    const std::vector<size_t>& connected(size_t part) const { return mConnected[part]; }

    /** How many connections of a client a part's dump has. */
    int64_t connectionsOf(size_t client, size_t part) const;

    /** For which client a connection of a part's dump counts on one of its sensors. */
    trace::Client clientOf(const ClientConnection& connection, uint32_t handle, size_t part) const;

private:
    /** What the lines of a tag on one sensor leave on, by uid. */
    struct Holder {
        std::optional<int32_t> uid;
        int64_t level = 0;
        size_t switchedOn = 0;  // line
    };
    using Holders = std::map<std::tuple<uint32_t, std::string>, std::vector<Holder>>;

    size_t numberOf(const trace::Client& client);
    void readTags(const Part& part);
    void readLines(const std::vector<NamedDump>& dumps, const JoinedLines& joined, const Part& part,
                   Holders* holders);
    void readConnections(const Part& part);

    /** Counts a line, and returns whose it is. */
    static std::optional<int32_t> takeHolder(bool on, std::optional<int32_t> uid, size_t line,
                                             std::vector<Holder>* holders);

    std::vector<trace::Client> mClients;
    std::map<std::tuple<std::string, std::optional<int32_t>, uint32_t>, size_t> mNumbers;
    std::vector<std::optional<size_t>> mOfLine;

    // By part.
    std::vector<std::map<std::string, std::optional<int32_t>>> mUids;  // by tag; none: they differ
    std::vector<std::map<size_t, int64_t>> mConnections;               // by client
    std::vector<std::vector<size_t>> mConnected;
    std::vector<std::set<std::tuple<uint32_t, std::string>>> mBare;  // have lines without a uid
};

}  // namespace capture
