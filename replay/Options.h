#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace replay {

/** What the command line asks for. */
struct Options {
    bool json = false;                       // print JSON Lines
    bool log = false;                        // print lines for a person, in order of time
    bool all = false;                        // print all rows of the summary's tables
    bool colours = false;                    // in the summary
    std::optional<size_t> columns;           // of the terminal that shows it
    bool printTrace = false;                 // print the trace made from a capture, play nothing
    bool check = false;                      // compare with "expect" lines, print no lines
    std::optional<std::string> timeline;     // the file to write trace events to
    std::optional<std::string> page;         // the file to write an HTML page to
    std::optional<std::string> uses;         // the file to write a row for each use to
    std::optional<std::string> sinceCharge;  // the same for the battery statistics
    std::vector<std::string> baseline;       // files that the others are held against
    bool merge = false;                      // the files are captures of one device
    int jobs = 1;                            // captures that are played at once, at least 1
    std::optional<std::string> properties;   // the file that keeps them; in memory without
    std::vector<std::string> files;          // "-" is standard input

    /** How many days are played or printed. */
    size_t inputs() const { return baseline.size() + (merge ? 1 : files.size()); }
};

}  // namespace replay
