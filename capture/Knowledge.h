#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "capture/Dating.h"
#include "capture/dump/Dump.h"
#include "trace/Note.h"

namespace capture {

// What a dump tells of times besides its registrations. Times are milliseconds of the trace's
// clock. `newestLine` is the dump's newest registration among all that were dated.

/** Until when a dump tells what is on, and how that is known. */
struct KnownEnd {
    int64_t at;
    trace::Bound bound;
};

/** It is never before the newest registration. */
KnownEnd knownEnd(const Dump& dump, const Dating& dating, size_t newestLine);

/** A one-shot sensor reported, which switches it off for all its clients. */
struct Firing {
    int64_t at;
    uint32_t handle;
};

/** The firings that the recent events hold up to the end of what is known; in no order. */
std::vector<Firing> firingsOf(const Dump& dump, const Dating& dating, size_t newestLine);

}  // namespace capture
