#include "replay/Jobs.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <vector>

#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "trace/Failure.h"
#include "trace/FileIo.h"

namespace replay {

namespace {

/** Ended jobs that wait for their turn hold two descriptors each. */
constexpr size_t kMaxWaiting = 200;

/** Prints the memory file `fd` on `to`, and closes it; false if that fails. */
bool print(int fd, int to) {
    lseek(fd, 0, SEEK_SET);
    const std::vector<unsigned char> bytes = trace::readAll(fd);
    close(fd);
    return trace::writeAll(to, bytes.data(), bytes.size());
}

}  // namespace

Jobs::~Jobs() {
    for (const Job& job : mJobs) {
        if (!job.ended) {
            kill(job.process, SIGKILL);
            waitpid(job.process, nullptr, 0);
        }
        close(job.out);
        close(job.error);
    }
}

int Jobs::start(const std::function<int()>& work) {
    while (mRunning == mCount || mJobs.size() == kMaxWaiting) {
        if (const int status = waitForOne()) return status;
    }
    Job job{};
    job.out = memfd_create("output", MFD_CLOEXEC);
    job.error = memfd_create("errors", MFD_CLOEXEC);
    const pid_t tool = getpid();
    job.process = job.out < 0 || job.error < 0 ? -1 : fork();
    if (job.process == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (getppid() != tool) _exit(trace::kStatusFailed);
        dup2(job.out, STDOUT_FILENO);
        dup2(job.error, STDERR_FILENO);
        _exit(work());
    }
    if (job.process < 0) {
        const int status = finish();
        std::fprintf(stderr, "cannot start a process: %s\n", std::strerror(errno));
        return status != 0 ? status : trace::kStatusFailed;
    }
    mJobs.push_back(job);
    ++mRunning;
    return 0;
}

int Jobs::finish() {
    while (!mJobs.empty()) {
        if (const int status = waitForOne()) return status;
    }
    return 0;
}

int Jobs::waitForOne() {
    int status = 0;
    const pid_t ended = waitpid(-1, &status, 0);
    const auto job = std::find_if(mJobs.begin(), mJobs.end(),
                                  [&](const Job& each) { return each.process == ended; });
    if (job != mJobs.end()) {
        job->ended = true;
        job->status = status;
        --mRunning;
        mTell(++mEnded);
    }
    return printEnded();
}

int Jobs::printEnded() {
    while (!mJobs.empty() && mJobs.front().ended) {
        const Job job = mJobs.front();
        mJobs.pop_front();
        if (!print(job.out, STDOUT_FILENO)) {
            std::fprintf(stderr, "cannot write standard output: %s\n", std::strerror(errno));
            return trace::kStatusFailed;
        }
        print(job.error, STDERR_FILENO);
        if (WIFSIGNALED(job.status)) {
            std::fprintf(stderr, "a process died: %s\n", strsignal(WTERMSIG(job.status)));
            return trace::kStatusFailed;
        }
        if (WEXITSTATUS(job.status) != 0) return WEXITSTATUS(job.status);
    }
    return 0;
}

}  // namespace replay
