#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include <sys/types.h>

namespace replay {

/**
 * Does the same work with many files in several processes at once, and prints what they print one
 * file after another, in the order of the files. What is not printed yet is kept in memory.
 */
class Jobs {
public:
    /** What is done with a file; the result is an exit status. */
    using Work = std::function<int(const std::string& name)>;

    /**
     * `count` processes; `tell` hears how many files are done, each time one is. What the work
     * writes to `outputs`, which are descriptors, is brought there in the order of the files.
     */
    Jobs(int count, std::vector<int> outputs, Work work, std::function<void(size_t)> tell);

    /** Ends what still runs. */
    ~Jobs();

    Jobs(const Jobs&) = delete;
    Jobs& operator=(const Jobs&) = delete;

    /** Returns the status of the first file that failed, after which nothing is printed; else 0. */
    int run(const std::vector<std::string>& names);

private:
    /** What came of a file. */
    struct Result {
        int status;
        std::vector<std::string> texts;  // for each output
    };

    /** A process that takes one file after another. */
    struct Worker {
        pid_t process;
        int results;           // the pipe on which it tells them
        std::string received;  // the beginning of a result
    };

    bool startWorker(const std::vector<std::string>& names);
    [[noreturn]] void work(const std::vector<std::string>& names, int results);

    /** The texts for the outputs, each behind its size. */
    std::vector<std::string> takeApart(const char* texts) const;

    /** Takes what a worker tells; false when it has ended. */
    bool receive(Worker* worker);
    int printDone();
    void endWorkers();

    const int mCount;
    const std::vector<int> mOutputs;
    const Work mWork;
    const std::function<void(size_t)> mTell;
    std::atomic<size_t>* const mNext;  // file that nobody has taken; shared by the processes
    std::vector<Worker> mWorkers;
    std::map<size_t, Result> mResults;  // not printed yet
    size_t mPrinted = 0;
};

}  // namespace replay
