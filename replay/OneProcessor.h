#pragma once

#include <sched.h>

namespace replay {

/**
 * Holds this thread on the processor where it is. A process forked meanwhile starts there as well,
 * and finds its parent's data in the caches; nobody waits until another processor wakes up, or has
 * time. The child lets itself go at once, for the scheduler to move it when both have work.
 */
class OneProcessor {
public:
    OneProcessor();
    ~OneProcessor() { letGo(); }

    OneProcessor(const OneProcessor&) = delete;
    OneProcessor& operator=(const OneProcessor&) = delete;

    /** Allows all processors that were allowed before. */
    void letGo();

private:
    cpu_set_t mAllowed;
    bool mHolds;
};

}  // namespace replay
