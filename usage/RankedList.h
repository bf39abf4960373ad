#pragma once

#include <algorithm>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include <json/json.h>

#include "core/StyledJson.h"

namespace android {

// The daily lists of connections. A module takes the ended connections out of its table under its
// lock, releases the lock, and makes the list of what it took.

/** Moves the connections for which `isEnded(info)` out of `table`, in the table's order. */
template <typename Info, typename IsEnded>
std::vector<std::pair<std::string, Info>> takeOut(std::unordered_map<std::string, Info>* table,
                                                  IsEnded isEnded) {
    std::vector<std::pair<std::string, Info>> ended;
    for (auto it = table->begin(); it != table->end();) {
        if (isEnded(it->second)) {
            ended.emplace_back(*it);
            it = table->erase(it);
        } else {
            ++it;
        }
    }
    return ended;
}

/**
 * The 50 connections that are first by `comp`, as JSON on one line; empty if there are none. "list"
 * has an object for each: its key as "pkg", and what `describe(info, &entry)` adds. The keys decide
 * ties, so that the list is the same on every platform.
 */
template <typename Info, typename Comp, typename Describe>
std::string rankedList(std::vector<std::pair<std::string, Info>> connections, Comp comp,
                       Describe describe) {
    constexpr size_t kMaxReported = 50;
    if (connections.empty()) return {};
    std::sort(connections.begin(), connections.end(), [comp](const auto& a, const auto& b) {
        if (comp(a, b)) return true;
        return !comp(b, a) && a.first < b.first;
    });
    if (connections.size() > kMaxReported) connections.resize(kMaxReported);

    Json::Value root;
    for (const auto& [key, info] : connections) {
        Json::Value& entry = root["list"].append(Json::Value());
        entry["pkg"] = key;
        describe(info, &entry);
    }
    return styledOnOneLine(root);
}

}  // namespace android
