#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string_view>
#include <vector>

namespace capture {

/** What somebody asks of a sensor that runs. */
struct RunningRequest {
    int64_t periodUs;  // printed as 1000 where less is asked
    std::optional<int64_t> batchUs;
};

/**
 * At which periods the device's own sensors run, by "Sensor Device:". It does not say for whom.
 * Virtual sensors are not in it, but what they ask of the device's own is.
 */
class SensorDevice {
public:
    /**
     * Takes a line "HANDLE) active-count = N; sampling_period(ms) = {1.0, 200.0}, ...;
     * batching_period(ms) = {0.0, 0.0}, ..."; ignores others.
     */
    void takeLine(std::string_view text);

    /** The requests of a sensor that are not disabled, in the printed order. */
    const std::vector<RunningRequest>& requestsOf(uint32_t handle) const;

private:
    std::map<uint32_t, std::vector<RunningRequest>> mRequests;  // by handle
};

}  // namespace capture
