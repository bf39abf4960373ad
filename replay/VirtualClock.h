#pragma once

#include <cstdint>

/**
 * Virtual time for the real Looper.
 *
 * An executable that links this defines `clock_gettime`, `epoll_wait` and `epoll_create1`; since
 * its symbols win over libc's, libutils and the library call these. The monotonic and the boot-time
 * clock stand still until the driver, the thread that calls the functions below, moves them. A
 * Looper's thread that comes to `epoll_wait` sleeps there until the driver lets it look at its
 * events again.
 *
 * So the driver's own calls into the library hold the worker: what they post runs in the next
 * `settle` or `advanceTo`, in which only the worker runs. There is one Looper thread at a time and
 * one driver; times are nanoseconds of both clocks.
 */
namespace virtual_clock {

/** The present moment; 0 at the start of the process. */
int64_t now();

/** Puts the clock at `time`, back too, without letting anything run. */
void set(int64_t time);

/** Lets the worker run until it has nothing left to do at the present moment. */
void settle();

/**
 * Lets the worker run all that falls due up to `time`, each at its own moment, and leaves the clock
 * at `time`, which must not lie in the past.
 */
void advanceTo(int64_t time);

}  // namespace virtual_clock
