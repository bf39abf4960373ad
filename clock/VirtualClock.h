#pragma once

#include <cstdint>
#include <functional>

/**
 * Virtual time for the real Looper.
 *
 * An executable that links this defines `clock_gettime` and `epoll_wait`, and libutils'
 * `systemTime` and `elapsedRealtimeNano`; since its symbols win over theirs, libutils and the
 * library call these. It also has libutils create threads through it. Two roles share one real
 * thread and never run at the same time:
 *
 *  - The driver calls the functions below. The monotonic and the boot-time clock stand still until
 *    it moves them.
 *  - A worker is a thread that libutils created for the library, with a Looper. It is a fiber (see
 *    clock/Fiber.h): it starts, and runs, in the driver's `settle` and `advanceTo` only, and goes
 *    back to the driver where it has to wait in `epoll_wait`.
 *
 * So the driver's own calls into the library hold the worker: what they post runs in the next
 * `settle` or `advanceTo`. Several workers take turns, the oldest first.
 *
 * Limits:
 *  - There is one driver, and it is the thread that runs when a worker is created.
 *  - A worker that waits for anything but its Looper's events blocks the driver as well. libutils
 *    refuses to wait for a worker's end.
 *  - A `Thread` with `canCallJava` false is a real thread. Its Looper waits in real time.
 *  - A debugger shows a worker's frames on the driver's thread while the worker runs.
 *
 * Times are nanoseconds of both clocks.
 */
namespace virtual_clock {

/** The present moment; 0 at the start of the process. */
int64_t now();

/** Puts the clock at `time`, back too, without letting anything run. */
void set(int64_t time);

/** Lets the workers run until they have nothing left to do at the present moment. */
void settle();

/**
 * Lets the workers run all that falls due up to `time`, each at its own moment, and leaves the
 * clock at `time`, which must not lie in the past. Calls `afterMoment` after each moment.
 */
void advanceTo(int64_t time, const std::function<void()>& afterMoment = {});

}  // namespace virtual_clock
