#pragma once

#include <string>
#include <vector>

#include "day/Causes.h"

namespace report {

/** Why times held and times reported differ, in words, and whom it concerns. */
struct CauseText {
    std::string text;
    std::vector<std::string> names;  // apps, or sensors that nobody watches; each once, in order
};

std::vector<CauseText> describeCauses(const day::Causes& causes);

}  // namespace report
