#pragma once

#include <vector>

#include "capture/DumpJoin.h"
#include "capture/NamedDump.h"
#include "trace/Note.h"

namespace capture {

/**
 * The enables of which nothing came, by client and result, oldest first. A line that several dumps
 * hold counts once.
 */
std::vector<trace::RefusedNote> refusalsOf(const std::vector<NamedDump>& dumps,
                                           const JoinedLines& joined);

}  // namespace capture
