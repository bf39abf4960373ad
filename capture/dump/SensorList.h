#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string_view>
#include <vector>

#include "trace/Note.h"

namespace capture {

/** The sensors of a device, as its list has them. Of a handle that repeats the first counts. */
class SensorList {
public:
    /**
     * Takes a sensor's first line, "HANDLE) NAME | VENDOR | ...", or the line below it that tells
     * how the sensor reports, "continuous | minRate=1.00Hz | ...". Ignores others.
     */
    void takeLine(std::string_view text);

    /** Takes the sensors of another dump whose handles this list lacks. */
    void takeMissing(const SensorList& other);

    /** The sensor with this handle, or null. */
    const trace::Sensor* find(uint32_t handle) const;

    /** The first one-shot sensor with this name, or null. */
    const trace::Sensor* findOneShot(std::string_view name) const;

    /** In the order of the list. */
    const std::vector<trace::Sensor>& sensors() const { return mSensors; }

private:
    bool insert(trace::Sensor sensor);
    void takeMode(std::string_view text, trace::Sensor* sensor);

    std::vector<trace::Sensor> mSensors;
    std::map<uint32_t, size_t> mPlaces;  // by handle
    bool mAwaitsMode = false;            // of the last sensor
};

}  // namespace capture
