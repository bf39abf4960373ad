#pragma once

#include <cstdint>
#include <vector>

#include "day/Journal.h"

namespace day {

/** When a capture tells who holds what, all its boots together. */
std::vector<Span> seenOf(const Journal& journal, size_t capture);

/** The part of a capture's time on battery in which it is known who held what. */
struct BatteryCoverage {
    int64_t seen = 0;           // ns
    bool isUpperBound = false;  // the charger is not known all the time
};

BatteryCoverage batteryCoverage(const Journal& journal, size_t capture);

}  // namespace day
