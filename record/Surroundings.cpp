#include "record/Surroundings.h"

#include <type_traits>

#include <cutils/properties.h>

#include "record/JsonText.h"
#include "record/Library.h"
#include "trace/CallTable.h"

namespace record {

namespace {

/** What the library reads. A test holds this list against its sources. */
constexpr const char* kProperties[] = {
        "persist.sys.ds_oriut",
        "persist.sys.fc_oriut",
        "persist.sys.oc_oriut",
        "persist.sys.sc_oriut",
        "persist.sys.skip_restrict",
        "persist.sys.total_oriut",
        "persist.sys.uc_oriut",
        "persist.zuno.device.invalid.count",
        "persist.zuno.flow.detect.count",
        "persist.zuno.rgb.shot.count",
        "persist.zuno.route.invalid.count",
        "persist.zuno.rx.close.count",
        "persist.zuno.ultra.enable.count",
        "persist.zuno.ultra.invalid.count",
        "persist.zuno.ultra.phone.enable.count",
        "persist.zuno.wechat.count.info",
        "ro.zuno.product.overseas",
        "service.bootanim.exit",
};

/** The host writes them without a lock, on purpose. */
__attribute__((no_sanitize("thread"))) int32_t read(const void* address, bool isBool) {
    return isBool ? *static_cast<const volatile bool*>(address)
                  : *static_cast<const volatile int32_t*>(address);
}

void appendKey(std::string* body, const char* action, const char* name) {
    if (body->empty()) {
        body->append("\"").append(action).append("\": {");
    } else {
        *body += ", ";
    }
    appendText(body, name);
    *body += ": ";
}

void appendFlagOrNumber(std::string* body, bool isBool, int32_t value) {
    if (isBool) {
        *body += value != 0 ? "true" : "false";
    } else {
        appendInteger(body, value);
    }
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
}

std::string Surroundings::takeVariables() {
    std::string body;
    for (Variable& variable : mVariables) {
        if (variable.address == nullptr) continue;
        const int32_t value = read(variable.address, variable.isBool);
        if (variable.known == value) continue;
        variable.known = value;
        appendKey(&body, "set", variable.name);
        appendFlagOrNumber(&body, variable.isBool, value);
    }
    return body.empty() ? body : body + '}';
}

std::string Surroundings::takeProperties() {
    std::string body;
    for (const char* name : kProperties) {
        char value[PROPERTY_VALUE_MAX] = {};
        property_get(name, value, "");
        const auto [known, isNew] = mKnownProperties.try_emplace(name, value);
        if (!isNew && known->second == value) continue;
        known->second = value;
        appendKey(&body, "property", name);
        if (value[0] == '\0') {
            body += "null";
        } else {
            appendText(&body, value);
        }
    }
    return body.empty() ? body : body + '}';
}

void Surroundings::noteProperty(const std::string& name, const std::string& value) {
    const auto known = mKnownProperties.find(name);
    if (known != mKnownProperties.end()) known->second = value;
}

void Surroundings::forget() {
    for (Variable& variable : mVariables) variable.known.reset();
    mKnownProperties.clear();
}

}  // namespace record
