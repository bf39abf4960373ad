#pragma once

#include <optional>
#include <string>
#include <vector>

#include "report/Output.h"

namespace replay {

struct Options {
    report::OutputFormat format = report::OutputFormat::kText;
    bool printTrace = false;                // print the trace made from a capture, play nothing
    std::optional<std::string> properties;  // the file that keeps them; in memory without
    std::vector<std::string> files;         // "-" is standard input
};

/**
 * Plays `options.files` one after another, each from a device boot on, and each boot in a process
 * of its own. Returns the exit status; what is wrong has been said on standard error.
 */
int replayFiles(const Options& options);

}  // namespace replay
