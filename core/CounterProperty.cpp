#include "core/CounterProperty.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <string>

#include <cutils/properties.h>

namespace android {

void parseInt32(const char* text, int32_t* value) {
    char* end = nullptr;
    const long long number = std::strtoll(text, &end, 10);
    if (end == text) return;
    *value = static_cast<int32_t>(std::clamp<long long>(number, std::numeric_limits<int32_t>::min(),
                                                        std::numeric_limits<int32_t>::max()));
}

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
