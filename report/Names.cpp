#include "report/Names.h"

#include <array>
#include <cstddef>
#include <cstdio>
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

std::string nameHandle(uint32_t handle) {
    char text[24];
    std::snprintf(text, sizeof(text), "handle 0x%08x", handle);
    return text;
}

/** The first of packages that share a uid, and how many there are besides. */
std::string namePackages(const std::vector<std::string>& packages) {
    const size_t others = packages.size() - 1;
    return packages[0] + (others > 0 ? " +" + std::to_string(others) : "");
}

}  // namespace

std::string nameApp(const day::Holder& holder) {
    if (holder.packages.empty()) return holder.handle ? holder.pkg : appOf(holder);
    const std::string& package = holder.packages[0];
    std::string name = namePackages(holder.packages);
    if (holder.pkg == package) return name;
    const bool isWithin = holder.pkg.compare(0, package.size() + 1, package + '.') == 0;
    return name + " (" + (isWithin ? holder.pkg.substr(package.size() + 1) : holder.pkg) + ')';
}

std::string nameUid(int32_t uid, const std::vector<std::string>& packages) {
    return packages.empty() ? "uid " + std::to_string(uid) : namePackages(packages);
}

std::string nameType(int32_t type) {
    return isPlatforms(type) ? std::string(kTypes[type]) : "type " + std::to_string(type);
}

std::string nameSensor(int32_t type, const std::string& name) {
    std::string word = nameType(type);
    if (name.empty()) return word;
    if (!isPlatforms(type)) return name;
    return strcasestr(name.c_str(), word.c_str()) != nullptr ? name : word + ": " + name;
}

std::string nameSensor(const day::Holder& holder) {
    const bool isListed = holder.type != 0 || !holder.sensor.empty();
    if (!isListed && holder.handle) return nameHandle(*holder.handle);
    return nameSensor(holder.type, holder.sensor);
}

}  // namespace report
