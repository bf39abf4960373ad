#pragma once

#include <functional>

// What this thread does with mutexes, its own and those of all libraries in the process.

/** How many it holds. */
int locksHeld();

/** Runs `act` just before it takes its `number`-th mutex from now. `act` must live until then. */
void beforeLock(int number, const std::function<void()>* act);

/** How many it still has to take before that; 0 if `act` has run. */
int locksUntilAct();
