#pragma once

#include <string>
#include <vector>

#include "report/page/PageModel.h"

namespace report::page {

/** The classes of a use: "slice", and "before", "unseen" and "on" where it is that. */
std::string styleOf(const Use& use);

/** The class of the line at a mark: "report" or "taken". */
const char* lineStyleOf(const Mark& mark);

/** What a lane shows from one moment to another. */
struct Slice {
    Span span;
    std::string style;  // its classes
    std::string facts;
    bool isBefore = false;
    bool isOn = false;
};

/** A lane above those of the sensors: reports, a state of the device. */
struct BandLane {
    std::string name;
    std::vector<Slice> slices;  // ordered by their begins
};

std::vector<BandLane> bandsOf(const Day& day);

/** The full hours around the days' uses and reports, but those ahead; empty if there is none. */
Span hoursOf(const std::vector<Day>& days);

/**
 * `day` from `hours.from` to `hours.to` as HTML, for where no script runs. Slices that are too
 * close to tell apart are drawn as one, and of many lanes the first are drawn: the page says so.
 */
std::string drawDay(const Day& day, Span hours);

}  // namespace report::page
