#pragma once

#include <cstdint>
#include <vector>

#include "day/Journal.h"

namespace day {

// Spans stand in order and apart from each other.

/** When a capture tells who holds what: from its first line on, but for its gaps. */
std::vector<Span> seenOf(const Journal& journal, size_t capture);

/** What lies in both. */
std::vector<Span> commonOf(const std::vector<Span>& a, const std::vector<Span>& b);

int64_t lengthOf(const std::vector<Span>& spans);

/** The part of a capture's time on battery in which it is known who held what. */
struct BatteryCoverage {
    int64_t seen = 0;           // ns
    bool isUpperBound = false;  // the charger is not known all the time
};

BatteryCoverage batteryCoverage(const Journal& journal, size_t capture);

}  // namespace day
