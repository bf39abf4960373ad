#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "capture/ClientTable.h"
#include "capture/Dating.h"
#include "capture/DumpJoin.h"
#include "capture/Knowledge.h"
#include "capture/Levels.h"
#include "capture/Part.h"
#include "trace/Note.h"

namespace capture {

/** What the trace tells of a client at a moment. */
struct UseStep {
    enum class Kind {
        kEarlier,  // an enable that no line tells
        kLine,     // a registration
        kEnd,      // a use ends, and no line tells it
    };

    int64_t at;
    Kind kind;
    size_t client;
    size_t part = 0;
    size_t index = 0;                // of the line, or among the part's earlier enables
    std::optional<int64_t> level{};  // of a line: see trace::RegistrationNote
    trace::EndNote::How how{};       // of an end
};

/** What uses are made of: the lines, and what they do not tell. */
struct UseSources {
    const JoinedLines& joined;
    const std::vector<Part>& parts;
    const ClientTable& clients;
    const Levels& levels;
    const Dating& dating;
    std::vector<Firing> firings;  // by time
};

/**
 * The steps of all uses in order. A reader needs no more than this to see each use as it was: an
 * enable begins a use or adds to it, a disable takes one away and ends the use with the last, an
 * end ends it. What is still on at `knownTo` is on then.
 */
std::vector<UseStep> useSteps(const UseSources& sources, int64_t start, int64_t knownTo);

}  // namespace capture
