#include "report/SensorNames.h"

#include <array>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace report {

namespace {

/** By type; empty where the platform has none. */
constexpr std::array<std::string_view, 43> kTypes{
        "",
        "accelerometer",
        "magnetic field",
        "orientation",
        "gyroscope",
        "light",
        "pressure",
        "temperature",
        "proximity",
        "gravity",
        "linear acceleration",
        "rotation vector",
        "relative humidity",
        "ambient temperature",
        "magnetic field, uncalibrated",
        "game rotation vector",
        "gyroscope, uncalibrated",
        "significant motion",
        "step detector",
        "step counter",
        "geomagnetic rotation vector",
        "heart rate",
        "tilt detector",
        "wake gesture",
        "glance gesture",
        "pick-up gesture",
        "wrist tilt gesture",
        "device orientation",
        "pose with six degrees of freedom",
        "stationary detection",
        "motion detection",
        "heart beat",
        "dynamic sensor meta",
        "additional info",
        "low-latency off-body detection",
        "accelerometer, uncalibrated",
        "hinge angle",
        "head tracker",
        "accelerometer, limited axes",
        "gyroscope, limited axes",
        "accelerometer, limited axes, uncalibrated",
        "gyroscope, limited axes, uncalibrated",
        "heading",
};

}  // namespace

std::string nameType(int32_t type) {
    if (type > 0 && static_cast<size_t>(type) < kTypes.size()) return std::string(kTypes[type]);
    return "type " + std::to_string(type);
}

std::string nameSensor(int32_t type, const trace::Origin* origin) {
    std::string word = nameType(type);
    std::string names;
    if (origin != nullptr) {
        const auto found = origin->namesOfType.find(type);
        if (found != origin->namesOfType.end()) {
            for (const std::string& name : found->second) {
                names += (names.empty() ? "" : " / ") + name;
            }
        }
    }
    if (names.empty()) return word;
    return strcasestr(names.c_str(), word.c_str()) != nullptr ? names : word + ": " + names;
}

}  // namespace report
