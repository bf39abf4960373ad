#include "replay/VirtualClock.h"

#include <atomic>
#include <condition_variable>
#include <limits>
#include <mutex>

#include <sys/epoll.h>
#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>

namespace {

constexpr int64_t kNever = std::numeric_limits<int64_t>::max();

std::atomic<int64_t> currentTime{0};

/** Where the Looper's thread is, as the driver has to know it. */
struct Worker {
    enum class State {
        kNone,     // there is no Looper, or its thread has ended
        kRunning,  // on its way to epoll_wait
        kAsleep,   // in epoll_wait
    };

    std::mutex mutex;
    std::condition_variable changed;
    State state = State::kNone;

    // While asleep.
    int epollFd = -1;
    int64_t deadline = kNever;

    /** Never destroyed: the Looper's thread sleeps on it until the process is gone. */
    static Worker& get() {
        static auto* const instance = new Worker;
        return *instance;
    }

    void enter(State newState) {
        const std::lock_guard lock(mutex);
        state = newState;
        changed.notify_all();
    }
};

/** Tells the driver that a Looper's thread has ended. */
struct EndOfThread {
    ~EndOfThread() { Worker::get().enter(Worker::State::kNone); }
};

/** What is ready now. `epoll_pwait` is libc's own, while `epoll_wait` is ours. */
int poll(int epollFd, epoll_event* events, int maxEvents) {
    return epoll_pwait(epollFd, events, maxEvents, 0, nullptr);
}

/** Whether the worker, once awake, has a reason to leave epoll_wait. */
bool hasReason(const Worker& worker) {
    epoll_event event;
    return worker.deadline <= virtual_clock::now() || poll(worker.epollFd, &event, 1) != 0;
}

}  // namespace

namespace virtual_clock {

int64_t now() {
    return currentTime.load(std::memory_order_relaxed);
}

void set(int64_t time) {
    currentTime.store(time, std::memory_order_relaxed);
}

void settle() {
    Worker& worker = Worker::get();
    std::unique_lock lock(worker.mutex);
    for (;;) {
        worker.changed.wait(lock, [&] { return worker.state != Worker::State::kRunning; });
        if (worker.state == Worker::State::kNone || !hasReason(worker)) return;
        worker.state = Worker::State::kRunning;
        worker.changed.notify_all();
    }
}

void advanceTo(int64_t time) {
    Worker& worker = Worker::get();
    for (settle(); worker.state == Worker::State::kAsleep && worker.deadline <= time; settle()) {
        set(worker.deadline);
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

extern "C" int epoll_create1(int flags) noexcept {
    Worker::get().enter(Worker::State::kRunning);  // its thread will come to epoll_wait
    return static_cast<int>(syscall(SYS_epoll_create1, flags));
}

extern "C" int epoll_wait(int epollFd, epoll_event* events, int maxEvents, int timeoutMs) {
    thread_local const EndOfThread endOfThread;
    Worker& worker = Worker::get();
    std::unique_lock lock(worker.mutex);
    worker.epollFd = epollFd;
    worker.deadline =
            timeoutMs < 0 ? kNever : virtual_clock::now() + int64_t{timeoutMs} * 1'000'000;
    worker.state = Worker::State::kAsleep;
    worker.changed.notify_all();
    worker.changed.wait(lock, [&] { return worker.state == Worker::State::kRunning; });
    return poll(epollFd, events, maxEvents);
}
