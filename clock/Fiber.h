#pragma once

#include <csetjmp>
#include <cstddef>
#include <memory>

namespace virtual_clock {

/**
 * A second flow of control on the thread that resumes it, with a stack of its own. It runs in
 * `resume` only, so that it and its resumer never run at the same time.
 *
 *  - A hand-over takes no lock and makes no system call.
 *  - Thread-local data, `errno` among them, and the thread's id are its resumer's.
 *  - A debugger shows a running fiber on the resumer's thread; one that is paused is not shown.
 *  - The address, leak and thread sanitizers are told of each hand-over.
 */
class Fiber {
public:
    using Function = int (*)(void* data);

    /**
     * A fiber that calls `function` with `data`. Its stack has `stackBytes`, rounded up to pages,
     * above a page that faults. Null if there is no memory for it.
     */
    static std::unique_ptr<Fiber> create(Function function, void* data, size_t stackBytes);

    /** Frees the stack. A fiber that has not ended leaves what lies there undestroyed. */
    ~Fiber();

    Fiber(const Fiber&) = delete;
    Fiber& operator=(const Fiber&) = delete;

    /** Runs the fiber until it pauses or ends. Always by the same thread; not once it has ended. */
    void resume();

    /** Called by the fiber itself: returns when it is resumed. */
    void pause() { handOver(&mInside, &mOutside); }

    /** Whether `function` has returned. */
    bool hasEnded() const { return mHasEnded; }

private:
    /** Where one of the two flows of control stands while the other one runs. */
    struct Side {
        jmp_buf place;

        // For the sanitizers.
        const void* stack = nullptr;  // lowest byte
        size_t stackBytes = 0;
        void* fakeStack = nullptr;
        void* threadState = nullptr;
    };

    Fiber(Function function, void* data, void* stack, size_t stackBytes, size_t guardBytes);

    void handOver(Side* from, Side* to);
    void leave(Side* from, Side* to);
    static void start();
    void run();

    // Constant after construction.
    const Function mFunction;
    void* const mData;
    void* const mStack;  // lowest byte; the guard lies below
    const size_t mStackBytes;
    const size_t mGuardBytes;

    Side mInside;
    Side mOutside;
    bool mHasStarted = false;
    bool mHasEnded = false;
};

}  // namespace virtual_clock
