#pragma once

#include <cstdint>
#include <vector>

#include "capture/Dating.h"
#include "capture/DumpJoin.h"
#include "capture/Source.h"
#include "capture/StateStretches.h"
#include "trace/Origin.h"

namespace capture {

/** What sources say of themselves beside the trace that begins at `start` and was made of them. */
trace::Origin originOf(const std::vector<Source>& sources, const JoinedLines& joined,
                       const Dating& dating, const StateStretches& states, int64_t start);

}  // namespace capture
