#include "record/Surroundings.h"

#include <cstring>
#include <type_traits>

#include <cutils/properties.h>

#include "base/Json.h"
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

/** The host writes them without a lock, as the library reads them. */
__attribute__((no_sanitize("thread"))) int32_t read(const void* address, bool isBool) {
    return isBool ? *static_cast<const volatile bool*>(address)
                  : *static_cast<const volatile int32_t*>(address);
}

/** The line's body that gives `action` the object of `members`; "" if there are none. */
std::string bodyOf(const char* action, const std::string& members) {
    if (members.empty()) return {};
    std::string body;
    base::JsonWriter(&body).key(action).raw('{' + members + '}');
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

std::string Surroundings::takeProperties(const char* only) {
    std::string members;
    base::JsonWriter json(&members);
    for (const char* name : kProperties) {
        if (only != nullptr && std::strcmp(name, only) != 0) continue;
        if (!mBeingWritten.empty() && mBeingWritten.count(name) != 0) continue;
        char value[PROPERTY_VALUE_MAX] = {};
        property_get(name, value, "");
        const auto [known, isNew] = mKnownProperties.try_emplace(name, value);
        if (!isNew && known->second == value) continue;
        known->second = value;
        json.key(name);
        if (value[0] == '\0') {
            json.raw("null");
        } else {
            json.value(value);
        }
    }
    return bodyOf("property", members);
}

void Surroundings::beginWrite(const std::string& name, const std::string& value) {
    const auto known = mKnownProperties.find(name);
    if (known != mKnownProperties.end()) known->second = value;
    mBeingWritten.insert(name);
}

void Surroundings::endWrite(const std::string& name) {
    const auto written = mBeingWritten.find(name);
    if (written != mBeingWritten.end()) mBeingWritten.erase(written);
}

void Surroundings::forget() {
    for (Variable& variable : mVariables) variable.known.reset();
    mKnownProperties.clear();
}

}  // namespace record
