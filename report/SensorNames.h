#pragma once

#include <cstdint>
#include <string>

#include "trace/Origin.h"

namespace report {

/**
 * The name of a sensor type: those that `origin`'s sensors of the type have; without any, the
 * platform's word for the type, or "type N". `origin` may be null.
 */
std::string nameSensor(int32_t type, const trace::Origin* origin);

/** The platform's word for a type, as "accelerometer", or "type N". */
std::string nameType(int32_t type);

}  // namespace report
