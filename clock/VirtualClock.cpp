#include "clock/VirtualClock.h"

#include <algorithm>
#include <atomic>
#include <limits>
#include <list>
#include <memory>
#include <utility>

#include <sys/epoll.h>
#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>
#include <utils/AndroidThreads.h>
#include <utils/SystemClock.h>
#include <utils/Timers.h>

#include "clock/Fiber.h"

namespace {

using virtual_clock::Fiber;

constexpr int64_t kNever = std::numeric_limits<int64_t>::max();

/** As much as a thread has by default; only the pages that are used take memory. */
constexpr size_t kStackBytes = size_t{8} << 20;

std::atomic<int64_t> currentTime{0};

/** A Looper's thread. */
class Worker {
public:
    explicit Worker(std::unique_ptr<Fiber> fiber) : mFiber(std::move(fiber)) {}

    bool hasEnded() const { return mFiber->hasEnded(); }

    /** When its wait is over though nothing happens. */
    int64_t deadline() const { return mDeadline; }

    /** Runs until there is nothing left to do at the present moment; false if there was nothing. */
    bool run() {
        if (!isReady()) return false;
        tRunning = this;
        mFiber->resume();
        tRunning = nullptr;
        return true;
    }

    /** `epoll_wait`, called by the worker itself. */
    int wait(int epollFd, epoll_event* events, int maxEvents, int timeoutMs) {
        mEpollFd = epollFd;
        mEvents = events;
        mMaxEvents = maxEvents;
        mDeadline = timeoutMs < 0 ? kNever : virtual_clock::now() + int64_t{timeoutMs} * 1'000'000;
        if (!isReady()) mFiber->pause();
        return mEventCount;
    }

    /** The one that runs on this thread; null for the driver. */
    static Worker* running() { return tRunning; }

private:
    /** Whether the wait is over. `epoll_pwait` is libc's own, while `epoll_wait` is ours. */
    bool isReady() {
        if (mEpollFd < 0) return true;
        mEventCount = epoll_pwait(mEpollFd, mEvents, mMaxEvents, 0, nullptr);
        return mEventCount != 0 || mDeadline <= virtual_clock::now();
    }

    const std::unique_ptr<Fiber> mFiber;

    // Its wait.
    int mEpollFd = -1;  // before the first one
    epoll_event* mEvents = nullptr;
    int mMaxEvents = 0;
    int mEventCount = 0;
    int64_t mDeadline = kNever;

    static thread_local Worker* tRunning;
};

thread_local Worker* Worker::tRunning = nullptr;

/** Those that have not ended, oldest first. Never destroyed: the stacks hold objects in use. */
std::list<Worker>& workers() {
    static auto* const instance = new std::list<Worker>;
    return *instance;
}

/** For libutils, in place of its own: creates a thread and returns 1, or 0 without memory. */
int createWorker(android_thread_func_t function, void* data, const char*, int32_t,
                 size_t stackBytes, android_thread_id_t* id) {
    auto fiber = Fiber::create(function, data, stackBytes > 0 ? stackBytes : kStackBytes);
    if (fiber == nullptr) return 0;
    workers().emplace_back(std::move(fiber));
    // The driver's own: libutils then refuses to block the driver until the worker has ended.
    if (id != nullptr) *id = androidGetThreadId();
    return 1;
}

[[maybe_unused]] const bool gCreatesWorkers = (androidSetCreateThreadFunc(createWorker), true);

}  // namespace

namespace virtual_clock {

int64_t now() {
    return currentTime.load(std::memory_order_relaxed);
}

void set(int64_t time) {
    currentTime.store(time, std::memory_order_relaxed);
}

void settle() {
    bool ran;
    do {
        ran = false;
        for (Worker& worker : workers()) ran |= worker.run();
        workers().remove_if([](const Worker& worker) { return worker.hasEnded(); });
    } while (ran && workers().size() > 1);  // one may have posted to another
}

void advanceTo(int64_t time, const std::function<void()>& afterMoment) {
    for (;;) {
        settle();
        if (afterMoment) afterMoment();
        int64_t deadline = kNever;
        for (const Worker& worker : workers()) deadline = std::min(deadline, worker.deadline());
        if (deadline > time) break;
        set(deadline);
    }
    set(time);
}

}  // namespace virtual_clock

extern "C" int clock_gettime(clockid_t clock, timespec* time) noexcept {
    if (clock != CLOCK_MONOTONIC && clock != CLOCK_BOOTTIME) {
        return static_cast<int>(syscall(SYS_clock_gettime, clock, time));
    }
    const int64_t now = virtual_clock::now();
    time->tv_sec = static_cast<time_t>(now / 1'000'000'000);
    time->tv_nsec = static_cast<long>(now % 1'000'000'000);
    return 0;
}

// libutils' own ones ask clock_gettime, which cannot tell 32-bit ARM a time past 68 years.

extern "C" nsecs_t systemTime(int clock) {
    if (clock == SYSTEM_TIME_MONOTONIC || clock == SYSTEM_TIME_BOOTTIME) {
        return virtual_clock::now();
    }
    timespec time;
    clock_gettime(clock, &time);  // the others have one number there and here
    return nsecs_t{time.tv_sec} * 1'000'000'000 + time.tv_nsec;
}

int64_t android::elapsedRealtimeNano() {
    return virtual_clock::now();
}

extern "C" int epoll_wait(int epollFd, epoll_event* events, int maxEvents, int timeoutMs) {
    Worker* const worker = Worker::running();
    return worker != nullptr ? worker->wait(epollFd, events, maxEvents, timeoutMs)
                             : epoll_pwait(epollFd, events, maxEvents, timeoutMs, nullptr);
}
