#pragma once

#include <string>

#include "capture/dump/Dump.h"

namespace capture {

/** A dump of a device and the file that held it. */
struct NamedDump {
    std::string name;
    Dump dump;
};

}  // namespace capture
