#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "report/Report.h"

namespace report {

/** What is known of where an input comes from, a line each, and the warnings of its import. */
std::vector<std::string> describe(const Input& input);

/** A number of things: "1 boot", "2 boots". */
std::string count(int64_t number, const std::string& noun);

}  // namespace report
