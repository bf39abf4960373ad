#undef _FORTIFY_SOURCE  // its check of jumps refuses those from one stack to another

#include "clock/Fiber.h"

#include <sanitizer/asan_interface.h>
#include <sanitizer/lsan_interface.h>
#include <sanitizer/tsan_interface.h>
#include <sys/mman.h>
#include <ucontext.h>
#include <unistd.h>

// Null in a build without the sanitizer that defines them.
#pragma weak __asan_handle_no_return
#pragma weak __lsan_register_root_region
#pragma weak __lsan_unregister_root_region
#pragma weak __sanitizer_finish_switch_fiber
#pragma weak __sanitizer_start_switch_fiber
#pragma weak __tsan_create_fiber
#pragma weak __tsan_destroy_fiber
#pragma weak __tsan_get_current_fiber
#pragma weak __tsan_switch_to_fiber

namespace virtual_clock {

namespace {

/** `makecontext` passes integers only. */
thread_local Fiber* tStarting = nullptr;

}  // namespace

std::unique_ptr<Fiber> Fiber::create(Function function, void* data, size_t stackBytes) {
    const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t size = (stackBytes + page - 1) / page * page;
    void* memory = mmap(nullptr, page + size, PROT_READ | PROT_WRITE,
                        MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE | MAP_STACK, -1, 0);
    if (memory == MAP_FAILED) return nullptr;
    std::unique_ptr<Fiber> fiber(
            new Fiber(function, data, static_cast<char*>(memory) + page, size, page));
    return mprotect(memory, page, PROT_NONE) == 0 ? std::move(fiber) : nullptr;
}

Fiber::Fiber(Function function, void* data, void* stack, size_t stackBytes, size_t guardBytes)
      : mFunction(function),
        mData(data),
        mStack(stack),
        mStackBytes(stackBytes),
        mGuardBytes(guardBytes) {
    mInside.stack = stack;
    mInside.stackBytes = stackBytes;
    if (__tsan_create_fiber != nullptr) mInside.threadState = __tsan_create_fiber(0);
    if (__lsan_register_root_region != nullptr) __lsan_register_root_region(stack, stackBytes);
}

Fiber::~Fiber() {
    if (__lsan_unregister_root_region != nullptr) {
        __lsan_unregister_root_region(mStack, mStackBytes);
    }
    if (__tsan_destroy_fiber != nullptr) __tsan_destroy_fiber(mInside.threadState);
    munmap(static_cast<char*>(mStack) - mGuardBytes, mGuardBytes + mStackBytes);
}

void Fiber::resume() {
    if (__tsan_get_current_fiber != nullptr) mOutside.threadState = __tsan_get_current_fiber();
    handOver(&mOutside, &mInside);
}

void Fiber::handOver(Side* from, Side* to) {
    if (_setjmp(from->place) == 0) leave(from, to);
    if (__sanitizer_finish_switch_fiber != nullptr) {
        __sanitizer_finish_switch_fiber(from->fakeStack, &to->stack, &to->stackBytes);
    }
}

void Fiber::leave(Side* from, Side* to) {
    if (__sanitizer_start_switch_fiber != nullptr) {
        __sanitizer_start_switch_fiber(mHasEnded ? nullptr : &from->fakeStack, to->stack,
                                       to->stackBytes);
    }
    if (__tsan_switch_to_fiber != nullptr) __tsan_switch_to_fiber(to->threadState, 0);
    if (mHasStarted) _longjmp(to->place, 1);
    mHasStarted = true;
    tStarting = this;
    ucontext_t context;
    getcontext(&context);
    context.uc_stack.ss_sp = mStack;
    context.uc_stack.ss_size = mStackBytes;
    makecontext(&context, start, 0);
    if (__asan_handle_no_return != nullptr) __asan_handle_no_return();  // as `_longjmp` does
    setcontext(&context);
}

void Fiber::start() {
    tStarting->run();
}

void Fiber::run() {
    if (__sanitizer_finish_switch_fiber != nullptr) {
        __sanitizer_finish_switch_fiber(nullptr, &mOutside.stack, &mOutside.stackBytes);
    }
    mFunction(mData);
    mHasEnded = true;
    leave(&mInside, &mOutside);
}

}  // namespace virtual_clock
