#pragma once

#include <string>

#include "capture/JoinedDay.h"

namespace capture {

/** The trace of a day: what the host calls, and notes of all that calls do not say. */
std::string traceOf(const JoinedDay& day);

}  // namespace capture
