#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string_view>
#include <vector>

#include "trace/Origin.h"

namespace capture {

/** The sensors of a device, as its list has them. Of a handle that repeats the first counts. */
class SensorList {
public:
    /** Takes a sensor's first line, "HANDLE) NAME | VENDOR | ..."; ignores others. */
    void line(std::string_view text);

    /** Takes the sensors of another dump whose handles this list lacks. */
    void add(const SensorList& other);

    std::optional<int32_t> typeOf(uint32_t handle) const;

    /** In the order of the list. */
    const std::vector<trace::Sensor>& sensors() const { return mSensors; }

private:
    void add(const trace::Sensor& sensor);

    std::vector<trace::Sensor> mSensors;
    std::map<uint32_t, int32_t> mTypes;  // by handle
};

}  // namespace capture
