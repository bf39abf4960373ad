#pragma once

#include <cstddef>
#include <vector>

#include "capture/DumpJoin.h"
#include "capture/NamedDump.h"

namespace capture {

/** The lines between two gaps, and the newest dump that holds some of them. */
struct Part {
    size_t first = 0;  // line
    size_t end = 0;    // behind the last line
    size_t newestLine = 0;
    const Dump* dump = nullptr;
};

/** The parts of the joined lines, oldest first. */
inline std::vector<Part> partsOf(const JoinedLines& joined, const std::vector<NamedDump>& dumps) {
    std::vector<Part> parts(1);
    for (const size_t gap : joined.gaps) {
        parts.back().end = gap;
        parts.emplace_back().first = gap;
    }
    parts.back().end = joined.lines.size();
    auto part = parts.begin();
    for (const JoinedDump& dump : joined.dumps) {
        while (dump.last >= part->end) ++part;
        part->dump = &dumps[dump.dump].dump;
        part->newestLine = dump.last;
    }
    return parts;
}

}  // namespace capture
