#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "base/Json.h"

/**
 * Members of trace lines that several rooms write, in the one form by which they are compared. A
 * header only: the recorder on the device takes it, too.
 */
namespace trace {

/** Adds the member "event": telemetry that was sent. */
inline void writeEvent(base::JsonWriter* json, std::string_view module, std::string_view id,
                       std::string_view payload) {
    json->key("event").beginObject();
    json->member("module", module).member("id", id).member("payload", payload);
    json->endObject();
}

/** Adds the member "property": a property that was set. */
inline void writeProperty(base::JsonWriter* json, std::string_view name, std::string_view value) {
    json->key("property").beginObject().member("name", name).member("value", value).endObject();
}

/** The member that `writeEvent` adds, as a text. */
inline std::string eventEntry(std::string_view module, std::string_view id,
                              std::string_view payload) {
    std::string text;
    base::JsonWriter json(&text);
    writeEvent(&json, module, id, payload);
    return text;
}

/** The member that `writeProperty` adds, as a text. */
inline std::string propertyEntry(std::string_view name, std::string_view value) {
    std::string text;
    base::JsonWriter json(&text);
    writeProperty(&json, name, value);
    return text;
}

}  // namespace trace
