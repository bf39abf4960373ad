#include "record/Settings.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

#include <cutils/properties.h>
#include <unistd.h>

namespace record {

namespace {

constexpr long kDefaultMegabytes = 16;
constexpr long kMostMegabytes = 2000;  // so that sizes and places in files fit 32 bits

char gFolderAtLoad[PATH_MAX];

/** The host may change its folder before its first call. */
__attribute__((constructor)) void noteFolder() {
    if (getcwd(gFolderAtLoad, sizeof(gFolderAtLoad)) == nullptr) gFolderAtLoad[0] = '\0';
}

std::string read(const char* variable, const char* property) {
    if (const char* value = std::getenv(variable)) return value;
    char value[PROPERTY_VALUE_MAX] = {};
    property_get(property, value, "");
    return value;
}

std::string readFolder() {
    std::string folder = read("SENSOR_PRIV_RECORD", "persist.debug.sensor_priv.record");
    if (!folder.empty() && folder.front() != '/')
        folder.insert(0, gFolderAtLoad + std::string("/"));
    return folder;
}

size_t readBytes() {
    const std::string text = read("SENSOR_PRIV_RECORD_MB", "persist.debug.sensor_priv.record_mb");
    char* end = nullptr;
    const long megabytes = std::strtol(text.c_str(), &end, 10);
    const bool isUsable = megabytes > 0 && *end == '\0';
    return static_cast<size_t>(isUsable ? std::min(megabytes, kMostMegabytes) : kDefaultMegabytes)
           << 20;
}

bool readHidesNames() {
    const std::string text =
            read("SENSOR_PRIV_RECORD_REDACT", "persist.debug.sensor_priv.record_redact");
    return !text.empty() && text != "0";
}

}  // namespace

Settings Settings::read() {
    return {readFolder(), readBytes(), readHidesNames()};
}

}  // namespace record
