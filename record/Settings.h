#pragma once

#include <cstddef>
#include <string>

namespace record {

/**
 * What docs/recording.md lists: environment variables or, where one is not set, properties. A
 * relative folder is one of the folder that was the current one when the recorder was loaded.
 */
struct Settings {
    std::string folder;  // an absolute path; empty: nothing is recorded
    size_t bytes = 0;    // what the record takes at most
    bool hidesNames = false;

    static Settings read();
};

}  // namespace record
