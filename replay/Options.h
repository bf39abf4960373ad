#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace replay {

struct FileOutput;

/** A file that is to be written. */
struct AskedFile {
    const FileOutput* output;
    std::string path;
};

/** What the command line asks for. */
struct Options {
    bool json = false;                      // print JSON Lines
    bool log = false;                       // print lines for a person, in order of time
    bool all = false;                       // print all rows of the summary's tables
    bool colours = false;                   // in the summary
    std::optional<size_t> columns;          // of the terminal that shows it
    bool printTrace = false;                // print the trace made from a capture, play nothing
    bool check = false;                     // compare with "expect" lines, print no lines
    std::vector<AskedFile> outputs;         // what is written to files of its own
    std::vector<std::string> baseline;      // files that the others are held against
    bool merge = false;                     // the files are captures of one device
    int jobs = 1;                           // captures that are played at once, at least 1
    std::optional<std::string> properties;  // the file that keeps them; in memory without
    std::vector<std::string> files;         // "-" is standard input

    /** How many days are played or printed. */
    size_t inputs() const { return baseline.size() + (merge ? 1 : files.size()); }
};

}  // namespace replay
