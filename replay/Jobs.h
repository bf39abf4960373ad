#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include <sys/types.h>

#include "base/Result.h"
#include "trace/Record.h"

namespace replay {

/**
 * Plays files in several processes at once, and hands on their records one file after another, in
 * the order of the files. What is not handed on yet is kept in memory.
 */
class Jobs {
public:
    /** Plays a file, in one of the processes; false if it fails, which `records` tell. */
    using Play = std::function<bool(const std::string& name, trace::RecordWriter* records)>;

    /** Takes all records of a file, as bytes; false if no more are wanted. */
    using Take = std::function<bool(const std::string& records)>;

    /** `count` processes; `tell` hears how many files are done, each time one is. */
    Jobs(int count, Play play, Take take, std::function<void(size_t)> tell);

    /** Ends what still runs. */
    ~Jobs();

    Jobs(const Jobs&) = delete;
    Jobs& operator=(const Jobs&) = delete;

    /** Returns when all records have been taken, or no more are wanted; fails if a process does. */
    base::Result<void> run(const std::vector<std::string>& names);

private:
    /** A process that plays one file after another. */
    struct Worker {
        pid_t process;
        int results;           // the pipe on which it tells them
        std::string received;  // the beginning of a result
    };

    bool startWorker(const std::vector<std::string>& names);
    [[noreturn]] void work(const std::vector<std::string>& names, int results);

    /** Takes what a worker tells; false when it has ended. */
    bool receive(Worker* worker);

    /** Hands on what is next in order; false if no more is wanted. */
    bool handOn();
    void endWorkers();

    const int mCount;
    const Play mPlay;
    const Take mTake;
    const std::function<void(size_t)> mTell;
    std::atomic<size_t>* const mNext;  // file that nobody has taken; shared by the processes
    std::vector<Worker> mWorkers;
    std::map<size_t, std::string> mResults;  // records of files, not handed on yet
    size_t mHandedOn = 0;                    // files
};

}  // namespace replay
