#pragma once

#include <algorithm>
#include <cstdint>
#include <string>

#include "core/Arithmetic.h"

namespace android {

// What the tables of connections share.

/** A connection's key in tables and reports: "pkg/opPkg". Nothing is escaped. */
inline std::string connectionKey(const std::string& pkg, const std::string& opPkg) {
    return pkg + "/" + opPkg;
}

/** Whether `part` occurs anywhere in `name`. */
inline bool nameHolds(const std::string& name, const char* part) {
    return name.find(part) != std::string::npos;
}

/** Adds an enable to a count of enables. A count below 0 is taken for 0. */
inline void nestEnable(int32_t* enableCount) {
    *enableCount = addWrapped(std::max(*enableCount, 0), 1);
}

/** Takes an enable from a count of enables. Returns whether none is left. */
inline bool unnestEnable(int32_t* enableCount) {
    *enableCount = addWrapped(*enableCount, -1);
    return *enableCount == 0;
}

}  // namespace android
