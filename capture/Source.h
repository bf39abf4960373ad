#pragma once

#include <string>

#include "capture/Dump.h"

namespace capture {

/** A dump of a device and the file that held it. */
struct Source {
    std::string name;
    Dump dump;
};

}  // namespace capture
