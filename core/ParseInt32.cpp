#include "core/ParseInt32.h"

#include <algorithm>
#include <cstdlib>
#include <limits>

namespace android {

void parseInt32(const char* text, int32_t* value) {
    // `strtol` would clamp at other numbers where a `long` has 64 bits.
    char* end = nullptr;
    const long long number = std::strtoll(text, &end, 10);
    if (end == text) return;
    *value = static_cast<int32_t>(std::clamp<long long>(number, std::numeric_limits<int32_t>::min(),
                                                        std::numeric_limits<int32_t>::max()));
}

}  // namespace android
