#pragma once

#include <string>

#include "report/Journal.h"

namespace report {

/**
 * A day of `journal` as an SVG: a lane for each app and sensor with its slices (class "slice"),
 * behind them bands for the display and the charger, and a mark for each report. Lengths across are
 * shares of the width, so that it fits any; what stands under the pointer is told by "title".
 * Empty if no sensor was held.
 */
std::string drawDay(const Journal& journal, const Day& day);

}  // namespace report
