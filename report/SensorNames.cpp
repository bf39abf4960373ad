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

bool isPlatforms(int32_t type) {
    return type > 0 && static_cast<size_t>(type) < kTypes.size();
}

}  // namespace

std::string nameType(int32_t type) {
    return isPlatforms(type) ? std::string(kTypes[type]) : "type " + std::to_string(type);
}

std::string nameSensor(int32_t type, const std::string& name) {
    std::string word = nameType(type);
    if (name.empty()) return word;
    if (!isPlatforms(type)) return name;
    return strcasestr(name.c_str(), word.c_str()) != nullptr ? name : word + ": " + name;
}

}  // namespace report
