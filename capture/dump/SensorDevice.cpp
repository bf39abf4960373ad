#include "capture/dump/SensorDevice.h"

#include <cmath>

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr double kLongestPeriodMs = 9e12;  // fits 64 bits in nanoseconds

/** "200.0" or "200.0(disabled)", in microseconds. */
std::optional<int64_t> parsePeriod(std::string_view text) {
    const auto ms = parseNumber<double>(text);
    if (!ms || *ms < 0 || *ms > kLongestPeriodMs) return std::nullopt;
    return std::llround(*ms * 1000);
}

}  // namespace

void SensorDevice::takeLine(std::string_view text) {
    const size_t bracket = text.find(')');
    const auto handle = parseHandle(text.substr(0, bracket));
    auto periods = valueOf(text, "sampling_period(ms) = {", {"}"});
    auto batches = valueOf(text, "batching_period(ms) = {", {"}"});
    if (bracket == std::string_view::npos || !handle || !periods) return;
    const auto [entry, isNew] = mRequests.try_emplace(*handle);
    while (isNew && !periods->empty()) {
        const std::string_view period = takePart(&*periods, ',');
        const std::string_view batch = batches ? takePart(&*batches, ',') : "";
        const auto periodUs = parsePeriod(period);
        if (!periodUs || endsWith(period, "(disabled)")) continue;
        entry->second.push_back({*periodUs, parsePeriod(batch)});
    }
}

const std::vector<RunningRequest>& SensorDevice::requestsOf(uint32_t handle) const {
    static const std::vector<RunningRequest> none;
    const auto found = mRequests.find(handle);
    return found == mRequests.end() ? none : found->second;
}

}  // namespace capture
