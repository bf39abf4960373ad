#pragma once

#include <string>

#include <hardware/sensors.h>
#include <utils/String8.h>
#include <utils/Vector.h>

#include "exception/UltraException.h"

namespace record {

// Each appends an argument of a call to `out`, as a trace has it. Texts are names of packages: they
// are written up to a NUL, and masked if the record is to have no names.

void appendArgument(std::string* out, bool value);
void appendArgument(std::string* out, int value);
void appendArgument(std::string* out, long long value);
void appendArgument(std::string* out, const std::string& name);
void appendArgument(std::string* out, const android::String8& name);
void appendArgument(std::string* out, const android::Vector<int>& list);
void appendArgument(std::string* out, const sensors_event_t& event);
void appendArgument(std::string* out, const android::UltraExceptionInfo& info);

/** A rectangle: left, top, right, bottom. */
void appendArgument(std::string* out, const int* rect);

/** The body of a call line. */
template <typename... Parameters>
std::string callBody(const char* name, const Parameters&... parameters) {
    std::string body;
    body.reserve(256);
    body += R"("call": ")";
    body += name;
    body += '"';
    if constexpr (sizeof...(parameters) > 0) {
        const char* separator = R"(, "args": [)";
        ((body += separator, appendArgument(&body, parameters), separator = ", "), ...);
        body += ']';
    }
    return body;
}

}  // namespace record
