#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "report/Payload.h"
#include "report/Table.h"

namespace report {

/** An event that the device reports. */
struct Event {
    int64_t at;  // nanoseconds
    std::string id;
    Fields fields;
};

/** An event laid out for a person. Rates are in Hz, times h:mm:ss. */
struct EventText {
    std::string title;                                        // time of day, id and meaning
    std::vector<std::pair<std::string, std::string>> values;  // what they are, and what they say
    std::vector<Table> lists;
};

/** Lays `event` out; its lists show at most `limit` rows. */
EventText layOut(const Event& event, size_t limit);

/** A key "pkg/opPkg" of a list, as `nameApp` names the app. */
std::string shortenApp(const std::string& app);

/** Properties with their values and their meaning. */
Table layOut(const std::map<std::string, std::string>& properties);

}  // namespace report
