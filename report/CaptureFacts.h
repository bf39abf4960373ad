#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "day/Journal.h"

namespace report {

/** What is known of the captures that an input was made of, a line each, and their warnings. */
std::vector<std::string> describeCaptures(const day::Journal& journal);

/** Of each capture that is not dated, what bounds what is known; else nothing. */
std::vector<std::string> describeBounds(const day::Journal& journal);

/** A moment of a capture, in ns, with its date, or with its day if no date is known. */
std::string formatMoment(int64_t ns, const day::Notes& notes);

/** A day by its date, or by its number if no date is known. */
std::string nameDay(const day::Journal& journal, const day::Day& day);

/** How much was played: "1 boot, 24:00:00 of the device's time". */
std::string describePlayed(const day::Journal& journal);

/** A number of things: "1 boot", "2 boots". */
std::string count(size_t number, const std::string& noun);

}  // namespace report
