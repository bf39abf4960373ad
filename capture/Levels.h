#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <vector>

#include "capture/ClientTable.h"
#include "capture/DumpJoin.h"
#include "capture/Part.h"

namespace capture {

/** An enable that no line tells: it was made before the lines of a part. */
struct EarlierEnable {
    size_t client = 0;
    int64_t periodUs = 0;
    std::optional<int64_t> batchUs;
    bool isKnown = true;  // false: the period is a guess
};

/**
 * How many of its enables each client has on.
 *
 * At the end of a part that is what its dump's connections say. From there the lines are followed
 * back: an off had one more before it, an on one less. So a use shows that began before the oldest
 * line that the device kept, and an on that ended without an off. Without connections only the
 * lines tell, from the oldest on.
 */
struct Levels {
    /** By line: what its client has on behind it. 0 behind an on that ended without an off. */
    std::vector<int64_t> behind;

    /** By part and client: what it has on when the part begins; clients that are not there, none.
     */
    std::vector<std::map<size_t, int64_t>> atStart;

    /** By part: the enables that stand before its lines, in this order. */
    std::vector<std::vector<EarlierEnable>> earlier;
};

Levels levelsOf(const JoinedLines& joined, const std::vector<Part>& parts,
                const ClientTable& clients);

}  // namespace capture
