#pragma once

#include <algorithm>
#include <cstdint>
#include <string>

#include "core/Arithmetic.h"

namespace android {

// What the tables of connections share.

/** The key of a connection in tables and reports: "pkg/opPkg". Nothing is escaped. */
inline std::string connectionKey(const std::string& pkg, const std::string& opPkg) {
    return pkg + "/" + opPkg;
}

/** Whether `part` occurs anywhere in `name`. */
inline bool nameHolds(const std::string& name, const char* part) {
    return name.find(part) != std::string::npos;
}

/** Adds an enable to a connection's count. A count that surplus disables took below 0 restarts. */
inline void nestEnable(int32_t* enableCount) {
    *enableCount = addWrapped(std::max(*enableCount, 0), 1);
}

/** Takes an enable from a connection's count. Returns whether that was the last one. */
inline bool unnestEnable(int32_t* enableCount) {
    *enableCount = addWrapped(*enableCount, -1);
    return *enableCount == 0;
}

}  // namespace android
