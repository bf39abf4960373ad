#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>

#include "report/Payload.h"

namespace report {

/** An event that the device reports. */
struct Event {
    int64_t at;  // nanoseconds
    std::string id;
    Fields fields;
};

/**
 * The event for a person: its time of day, id and meaning, then its values, of a list the first
 * `limit`. Rates are in Hz, times h:mm:ss.
 */
std::string layOut(const Event& event, size_t limit);

/** A key "pkg/opPkg" of a list, as `nameApp` names the app. */
std::string shortenApp(const std::string& app);

/** Properties with their values and their meaning, as a table. */
std::string layOutProperties(const std::map<std::string, std::string>& properties);

}  // namespace report
