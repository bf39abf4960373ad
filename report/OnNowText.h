#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "day/OnNow.h"
#include "report/Table.h"

namespace report {

inline constexpr char kOnNowHeading[] = "On when it was taken";

/** What is on when a capture is taken. */
struct OnNowText {
    std::vector<std::string> before;  // lines above the table
    Table rows;
    std::vector<std::string> after;  // lines below it
};

/** Shows at most `limit` rows. */
OnNowText describeOnNow(const day::Journal& journal, size_t capture, size_t limit);

}  // namespace report
