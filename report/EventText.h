#pragma once

#include <cstddef>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "base/Json.h"
#include "day/Journal.h"
#include "day/Payload.h"
#include "report/Table.h"

namespace report {

/** An event laid out for a person. Rates are in Hz, times h:mm:ss. */
struct EventText {
    std::string title;                                        // time of day, id and meaning
    std::vector<std::pair<std::string, std::string>> values;  // what they are, and what they say
    std::vector<Table> lists;
};

/** Lays `event` out; its lists show at most `limit` rows. */
EventText layOutEvent(const day::Event& event, size_t limit);

/** The event in words, as "screen samples of the day"; empty for an unknown one. */
std::string_view describe(trace::EventKind kind);

/** A key "pkg/opPkg" of a list, as `day::appOf` names the app. */
std::string shortenApp(const std::string& app);

/** Properties with their values and their meaning. */
Table propertyTable(const std::map<std::string, std::string>& properties);

/** Writes a JSON object. Lists are arrays of objects; all other values are texts. */
void writeFields(const std::vector<day::Field>& fields, base::JsonWriter* json);

}  // namespace report
