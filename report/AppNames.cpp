#include "report/AppNames.h"

#include <cstdio>

#include "report/SensorNames.h"

namespace report {

namespace {

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

std::string nameSensor(const day::Holder& holder) {
    const bool isListed = holder.type != 0 || !holder.sensor.empty();
    if (!isListed && holder.handle) return nameHandle(*holder.handle);
    return nameSensor(holder.type, holder.sensor);
}

}  // namespace report
