#pragma once

#include <cstddef>
#include <deque>
#include <functional>
#include <utility>

#include <sys/types.h>

namespace replay {

/**
 * Runs work in processes, several at once, and prints what they have printed one after another, in
 * the order in which they were started.
 */
class Jobs {
public:
    /** At most `count` run at once; `tell` hears how many have ended, each time one does. */
    Jobs(int count, std::function<void(size_t)> tell) : mCount(count), mTell(std::move(tell)) {}

    /** Ends what still runs. */
    ~Jobs();

    Jobs(const Jobs&) = delete;
    Jobs& operator=(const Jobs&) = delete;

    /**
     * Starts `work`, whose result is an exit status, as soon as fewer than `count` run. Returns the
     * status of the first job that has failed, after which nothing more is printed; else 0.
     */
    int start(const std::function<int()>& work);

    /** Waits for all jobs. Returns as `start` does. */
    int finish();

private:
    struct Job {
        pid_t process;
        int out;  // memory files: standard output and standard error
        int error;
        bool ended = false;
        int status = 0;  // as waitpid has it
    };

    /** Waits until a job ends, then prints those whose turn it is. */
    int waitForOne();
    int printEnded();

    const int mCount;
    const std::function<void(size_t)> mTell;
    size_t mEnded = 0;
    int mRunning = 0;
    std::deque<Job> mJobs;  // not printed yet
};

}  // namespace replay
