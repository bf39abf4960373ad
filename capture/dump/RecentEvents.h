#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace capture {

/** When a sensor reported, by two clocks. */
struct RecentEvent {
    int64_t sinceBoot;  // ms, sleep included
    int64_t timeOfDay;  // ms, local time
};

/** The newest events of each sensor, by "Recent Sensor events:". */
class RecentEvents {
public:
    /** Takes "NAME: last N events" or "1 (ts=248642.173971992, wall=10:43:45.967) ..."; ignores
     * others. */
    void takeLine(std::string_view text);

    /** By the sensor's name. Sensors of one name share a list. */
    const std::map<std::string, std::vector<RecentEvent>>& lists() const { return mLists; }

    /** The newest of all lists, by the time since boot. */
    const std::optional<RecentEvent>& newest() const { return mNewest; }

private:
    std::map<std::string, std::vector<RecentEvent>> mLists;
    std::vector<RecentEvent>* mList = nullptr;  // the one that is being read
    std::optional<RecentEvent> mNewest;
};

}  // namespace capture
