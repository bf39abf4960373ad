#pragma once

#include <string>

#include <hardware/sensors.h>
#include <utils/String8.h>
#include <utils/Vector.h>

#include "base/Json.h"
#include "exception/UltraException.h"

namespace record {

// Each writes an argument of a call, as a trace has it. Texts are names of packages: they are
// written up to a NUL, and as pseudonyms if the record is to have no names.

void writeArgument(base::JsonWriter* json, bool value);
void writeArgument(base::JsonWriter* json, int value);
void writeArgument(base::JsonWriter* json, long long value);
void writeArgument(base::JsonWriter* json, const std::string& name);
void writeArgument(base::JsonWriter* json, const android::String8& name);
void writeArgument(base::JsonWriter* json, const android::Vector<int>& list);
void writeArgument(base::JsonWriter* json, const sensors_event_t& event);
void writeArgument(base::JsonWriter* json, const android::UltraExceptionInfo& info);

/** A rectangle: left, top, right, bottom. */
void writeArgument(base::JsonWriter* json, const int* rect);

/** The members of a call's line. */
template <typename... Parameters>
std::string callBody(const char* name, const Parameters&... parameters) {
    std::string body;
    body.reserve(256);
    base::JsonWriter json(&body);
    json.member("call", name);
    if constexpr (sizeof...(parameters) > 0) {
        json.key("args").beginArray();
        (writeArgument(&json, parameters), ...);
        json.endArray();
    }
    return body;
}

}  // namespace record
