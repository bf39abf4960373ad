#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "report/Report.h"

namespace report {

/** What is known of where an input comes from, a line each, and the warnings of its import. */
std::vector<std::string> describe(const Input& input);

/** The moment up to which `input` is known, ns: `end` of its trace, but of a capture its taking. */
int64_t lastKnown(const Input& input, int64_t end);

/** A number of things: "1 boot", "2 boots". */
std::string count(int64_t number, const std::string& noun);

}  // namespace report
