#pragma once

#include <cstdint>
#include <string>

namespace report {

/** The platform's word for a type, as "accelerometer", or "type N". */
std::string nameType(int32_t type);

/**
 * A sensor by its name, behind the word for its type where that is not in it, or by the word. Types
 * of makers have none.
 */
std::string nameSensor(int32_t type, const std::string& name);

}  // namespace report
