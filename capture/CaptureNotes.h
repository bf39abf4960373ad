#pragma once

#include "capture/JoinedDay.h"
#include "trace/Note.h"

namespace capture {

/** What the trace's first line notes of the whole capture. */
trace::Note headNote(const JoinedDay& day);

/** What is on when the newest dump is taken; it stands at the end of what is known. */
trace::Note takenNote(const JoinedDay& day);

}  // namespace capture
