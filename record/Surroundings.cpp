#include "record/Surroundings.h"

#include <type_traits>

#include <cutils/properties.h>

#include "base/Json.h"
#include "record/Library.h"
#include "trace/CallTable.h"
#include "trace/Words.h"

namespace record {

namespace {

/** The host writes them without a lock, as the library reads them. */
__attribute__((no_sanitize("thread"))) int32_t read(const void* address, bool isBool) {
    return isBool ? *static_cast<const volatile bool*>(address)
                  : *static_cast<const volatile int32_t*>(address);
}

/** The line's body that gives `action` the object of `members`; "" if there are none. */
std::string bodyOf(const char* action, const std::string& members) {
    if (members.empty()) return {};
    std::string body;
    base::JsonWriter(&body).key(action).beginObject().raw(members).endObject();
    return body;
}

}  // namespace

Surroundings::Surroundings()
      : mVariables{
#define CALL(Class, operation, parameters)
#define VARIABLE(name) \
    {#name, findVariable(#name), std::is_same_v<decltype(::name), bool>, std::nullopt},
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
        } {
    for (const auto& each : trace::kProperties) mProperties.push_back({each.name, std::nullopt, 0});
}

std::string Surroundings::takeVariables() {
    std::string members;
    base::JsonWriter json(&members);
    for (Variable& variable : mVariables) {
        if (variable.address == nullptr) continue;
        const int32_t value = read(variable.address, variable.isBool);
        if (variable.known == value) continue;
        variable.known = value;
        json.key(variable.name);
        if (variable.isBool) {
            json.value(value != 0);
        } else {
            json.value(value);
        }
    }
    return bodyOf("set", members);
}

std::string Surroundings::takeProperties() {
    std::string members;
    for (Property& property : mProperties) take(&property, &members);
    return bodyOf("property", members);
}

std::string Surroundings::takeProperty(std::string_view name) {
    std::string members;
    take(find(name), &members);
    return bodyOf("property", members);
}

void Surroundings::take(Property* property, std::string* members) {
    if (property->writes > 0) return;
    char value[PROPERTY_VALUE_MAX] = {};
    property_get(property->name.data(), value, "");
    if (property->known == value) return;
    property->known = value;
    if (!members->empty()) *members += ", ";
    base::JsonWriter json(members);
    json.key(property->name);
    if (value[0] == '\0') {
        json.raw("null");
    } else {
        json.value(value);
    }
}

void Surroundings::beginWrite(std::string_view name, const std::string& value) {
    Property* const property = find(name);
    if (property == nullptr) return;
    if (property->known) property->known = value;
    ++property->writes;
}

void Surroundings::endWrite(std::string_view name) {
    if (Property* const property = find(name)) --property->writes;
}

void Surroundings::forget() {
    for (Variable& variable : mVariables) variable.known.reset();
    for (Property& property : mProperties) property.known.reset();
}

Surroundings::Property* Surroundings::find(std::string_view name) {
    for (Property& property : mProperties) {
        if (property.name == name) return &property;
    }
    return nullptr;
}

}  // namespace record
