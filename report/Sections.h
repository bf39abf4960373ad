#pragma once

#include <cstddef>
#include <vector>

#include "day/Journal.h"
#include "report/Section.h"

// What the summary and the page both show of an input, but its days. Tables show at most `limit`
// rows.

namespace report {

/** What stands before the days: what is on when a capture is taken. */
std::vector<Section> sectionsBefore(const day::Journal& journal, size_t limit);

/** What stands behind the days: battery statistics, reports, causes, stored values. */
std::vector<Section> sectionsAfter(const day::Journal& journal, size_t limit);

/** What is on when a capture is taken. */
Section layOutOnNow(const day::Journal& journal, size_t capture, size_t limit);

/** What apps held since the last charge, of a capture that has battery statistics. */
Section layOutSinceCharge(const day::Journal& journal, size_t capture, size_t limit);

/** Why times held and times reported differ, and whom each cause concerns. */
Section layOutCauses(const day::Causes& causes);

}  // namespace report
