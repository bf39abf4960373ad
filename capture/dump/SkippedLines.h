#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace capture {

/** Lines that are left out: how many, and the first of them. */
struct SkippedLines {
    int64_t count = 0;
    int64_t firstNumber = 0;
    std::string firstQuoted;  // its start

    void add(std::string_view text, int64_t lineNumber);

    /** "2 lines ..., the first is "..."" */
    std::string naming(std::string_view what) const;
};

}  // namespace capture
