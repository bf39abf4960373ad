#pragma once

#include <cstdint>
#include <vector>

#include "trace/Note.h"

namespace day {

/** From `from` to `to`, in nanoseconds of the clock. */
struct Span {
    int64_t from = 0;
    int64_t to = 0;
};

/** Milliseconds of a note in ns. A note may say any number: it is kept to what a clock can have. */
int64_t toClock(int64_t ms);

// Spans in a vector stand in order and apart from each other.

/** Intervals of a note, whatever it says. */
std::vector<Span> spansOf(const std::vector<trace::Interval>& intervals);

/** What lies in both. */
std::vector<Span> commonOf(const std::vector<Span>& a, const std::vector<Span>& b);

/** What lies in `span` and in none of the others. */
std::vector<Span> without(Span span, const std::vector<Span>& others);

/** All of them together, ns. */
int64_t lengthOf(const std::vector<Span>& spans);

}  // namespace day
