#pragma once

#include <cstdint>
#include <vector>

#include "day/Journal.h"

namespace day {

/** A sensor that a client has on. */
struct OnRow {
    Holder holder;
    const Use* use = nullptr;  // what the lines tell of it; null: nothing
    int64_t connections = 1;
    bool hasAccess = true;  // false: it gets no data
    int64_t wakeLocks = 0;
};

/**
 * What is on when a capture is taken: first continuous sensors by their rate, where those come
 * first whose rate is not known, then all others from the oldest to the newest.
 */
struct OnNow {
    bool isFromConnections = false;  // false: there is no table of them, and the lines tell it
    std::vector<OnRow> rows;
};

/** The result points into the journal. */
OnNow whatIsOn(const Journal& journal, size_t capture);

}  // namespace day
