#pragma once

#include <cstddef>
#include <string>

#include "day/Journal.h"
#include "report/Table.h"

namespace report {

inline constexpr char kChargeHeading[] = "Since the last charge";

/** What apps held on battery since the last charge, by the device's own battery statistics. */
struct ChargeText {
    std::string line;  // which part of it the registrations cover
    Table rows;        // the longest held first
};

/** Of a capture that has them: `sinceCharge` of its `taken()`. Shows at most `limit` rows. */
ChargeText describeSinceCharge(const day::Journal& journal, size_t capture, size_t limit);

}  // namespace report
