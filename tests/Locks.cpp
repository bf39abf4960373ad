#include "tests/Locks.h"

#include <dlfcn.h>
#include <pthread.h>

namespace {

thread_local int held = 0;
thread_local int untilAct = 0;
thread_local const std::function<void()>* toAct = nullptr;

using Function = int (*)(pthread_mutex_t*);

Function find(const char* name) {
    return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
}

}  // namespace

// The sanitizers' own, in their builds.
extern "C" int sanitizersLock(pthread_mutex_t* mutex) asm("__interceptor_pthread_mutex_lock")
        __attribute__((weak));
extern "C" int sanitizersUnlock(pthread_mutex_t* mutex) asm("__interceptor_pthread_mutex_unlock")
        __attribute__((weak));

extern "C" int pthread_mutex_lock(pthread_mutex_t* mutex) noexcept {
    static const Function libcs = find("pthread_mutex_lock");
    if (untilAct > 0 && --untilAct == 0) (*toAct)();
    ++held;
    return sanitizersLock != nullptr ? sanitizersLock(mutex) : libcs(mutex);
}

extern "C" int pthread_mutex_unlock(pthread_mutex_t* mutex) noexcept {
    static const Function libcs = find("pthread_mutex_unlock");
    --held;
    return sanitizersUnlock != nullptr ? sanitizersUnlock(mutex) : libcs(mutex);
}

int locksHeld() {
    return held;
}

void beforeLock(int number, const std::function<void()>* act) {
    untilAct = number;
    toAct = act;
}

int locksUntilAct() {
    return untilAct;
}
