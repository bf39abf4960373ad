#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "capture/ClientTable.h"
#include "capture/Dating.h"
#include "capture/DumpJoin.h"
#include "capture/JoinedStates.h"
#include "capture/Knowledge.h"
#include "capture/Levels.h"
#include "capture/NamedDump.h"
#include "capture/Part.h"
#include "capture/UseSteps.h"

namespace capture {

/**
 * All that a device's dumps tell, joined and dated: what a trace is written of. Times are
 * milliseconds of the trace's clock, unless they are said to be wall times.
 */
struct JoinedDay {
    std::vector<NamedDump> dumps;
    JoinedLines joined;
    Dating dating;
    std::vector<Part> parts;
    SensorList sensors;   // of all dumps
    int64_t start = 0;    // of the trace
    KnownEnd knownEnd{};  // of the last dump
    JoinedStates states;
    std::vector<StateValue> changes;  // of states, from the start on; wall times
    ClientTable clients;
    Levels levels;
    std::vector<UseStep> steps;
    std::vector<std::string> warnings;
};

}  // namespace capture
