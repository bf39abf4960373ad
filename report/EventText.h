#pragma once

#include <cstddef>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "base/Json.h"
#include "day/Journal.h"
#include "day/Payload.h"
#include "report/Section.h"

namespace report {

/**
 * An event under its time of day, id and meaning. Rates are in Hz, times h:mm:ss; its lists show at
 * most `limit` rows.
 */
Section layOutEvent(const day::Event& event, size_t limit);

/** The event in words, as "screen samples of the day"; empty for an unknown one. */
std::string_view describe(trace::EventKind kind);

/** A key "pkg/opPkg" of a list, as `day::appOf` names the app. */
std::string shortenApp(const std::string& app);

/** Properties with their values and their meaning. */
Table propertyTable(const std::map<std::string, std::string>& properties);

/** Writes a JSON object. Lists are arrays of objects; all other values are texts. */
void writeFields(const std::vector<day::Field>& fields, base::JsonWriter* json);

}  // namespace report
