#pragma once

#include <cstdint>
#include <string>

#include "trace/Origin.h"

namespace report {

/**
 * A sensor type by the names that `origin`'s sensors of the type have, behind the platform's word
 * for it where they do not say it; without names, that word alone. `origin` may be null.
 */
std::string nameSensor(int32_t type, const trace::Origin* origin);

/** The platform's word for a type, as "accelerometer", or "type N". */
std::string nameType(int32_t type);

}  // namespace report
