#pragma once

#include <string>
#include <string_view>

#include "record/Run.h"

namespace record {

/**
 * Puts what runs do at the same time into the order of a replay, in which one ends before the next
 * begins: what a run does is held back until all runs that began before it have ended.
 *
 * Lines end with a line feed. Not safe for threads by itself.
 */
class RunOrder {
public:
    /** `run` begins. */
    void begin(Run* run);

    /** Whether what `run` does may be written now; if not, `line` is held back. */
    bool mayWrite(Run* run, std::string_view line);

    /** `run` ends. Returns the lines that may be written now. */
    std::string end(Run* run);

private:
    Run* mOldest = nullptr;
    Run* mNewest = nullptr;
};

}  // namespace record
