#include "record/Settings.h"

#include <algorithm>
#include <cstdlib>

#include <cutils/properties.h>

namespace record {

namespace {

constexpr unsigned long kDefaultMegabytes = 16;
constexpr unsigned long kMostMegabytes = 2000;  // so that sizes and places in files fit 32 bits

std::string read(const char* variable, const char* property) {
    if (const char* value = std::getenv(variable)) return value;
    char value[PROPERTY_VALUE_MAX] = {};
    property_get(property, value, "");
    return value;
}

}  // namespace

Settings Settings::read() {
    const auto megabytes = std::strtoul(
            record::read("SENSOR_PRIV_RECORD_MB", "persist.debug.sensor_priv.record_mb").c_str(),
            nullptr, 10);
    const std::string hidesNames =
            record::read("SENSOR_PRIV_RECORD_REDACT", "persist.debug.sensor_priv.record_redact");
    return {record::read("SENSOR_PRIV_RECORD", "persist.debug.sensor_priv.record"),
            size_t{std::min(megabytes > 0 ? megabytes : kDefaultMegabytes, kMostMegabytes)} << 20,
            !hidesNames.empty() && hidesNames != "0"};
}

}  // namespace record
