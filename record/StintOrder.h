#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "record/Stint.h"

namespace record {

/**
 * Puts what stints do at the same time into the order of a replay, in which one ends before the
 * next begins: what a stint does is held back until all stints that began before it have ended.
 *
 * Lines end with a line feed. Not safe for threads by itself.
 */
class StintOrder {
public:
    /** `stint` begins. */
    void begin(Stint* stint);

    /** Whether what `stint` does may be written now; if not, `line` is held back. */
    bool mayWrite(Stint* stint, std::string_view line);

    /**
     * `stint` ends, or is not waited for any longer. Returns the lines that may be written now.
     * What it does afterwards may be written at once.
     */
    std::string end(Stint* stint);

    /** All stints end, and what is held back is dropped. */
    void clear();

    /** The stint that all others wait for; null if there is none. */
    Stint* oldest() const { return mOldest; }

    /** How many bytes are held back. */
    size_t heldBytes() const { return mHeldBytes; }

private:
    void remove(Stint* stint);

    Stint* mOldest = nullptr;
    Stint* mNewest = nullptr;
    size_t mHeldBytes = 0;
};

}  // namespace record
