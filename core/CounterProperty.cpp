#include "core/CounterProperty.h"

#include <string>

#include <cutils/properties.h>

#include "core/ParseInt32.h"

namespace android {

int32_t CounterProperty::load() const {
    char text[PROP_VALUE_MAX] = "0";
    property_get(mName, text, "0");
    int32_t value = 0;
    parseInt32(text, &value);
    return value;
}

void CounterProperty::store(int32_t value) const {
    property_set(mName, std::to_string(value).c_str());
}

}  // namespace android
