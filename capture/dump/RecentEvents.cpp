#include "capture/dump/RecentEvents.h"

#include <array>
#include <cmath>

#include "capture/dump/WallTime.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr double kLongestUptime = 9e12;  // seconds; fits 64 bits in milliseconds

std::optional<RecentEvent> parseEvent(std::string_view text) {
    const auto seconds = parseNumber<double>(valueOf(text, "(ts=", {","}).value_or(""));
    const auto wall = valueOf(text, "wall=", {")"});
    std::array<int, 4> fields;
    if (!seconds || !(std::fabs(*seconds) < kLongestUptime) || !wall ||
        !readFields(*wall, "##:##:##.###", fields.data())) {
        return std::nullopt;
    }
    const auto time = base::timeOfDay(fields[0], fields[1], fields[2]);
    if (!time) return std::nullopt;
    return RecentEvent{std::llround(*seconds * 1000), *time + fields[3]};
}

}  // namespace

void RecentEvents::takeLine(std::string_view text) {
    if (const auto event = parseEvent(text)) {
        if (mList != nullptr) mList->push_back(*event);
        if (!mNewest || mNewest->sinceBoot < event->sinceBoot) mNewest = event;
    } else if (const size_t end = text.rfind(": last ");
               end != std::string_view::npos && endsWith(text, " events")) {
        mList = &mLists[std::string(trimmed(text.substr(0, end)))];
    }
}

}  // namespace capture
