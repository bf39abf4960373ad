#pragma once

#include <string>
#include <vector>

#include "day/Findings.h"

namespace report {

/** Whether the input tells enough to find something. */
bool hasFindings(const day::Journal& journal);

/** What a person should know first, a sentence each; one that says so if there is nothing. */
std::vector<std::string> describeFindings(const day::Journal& journal);

}  // namespace report
