#include "replay/Jobs.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <new>
#include <string_view>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/FileIo.h"

namespace replay {

namespace {

/** What stands in front of a file's records in a worker's pipe. */
struct Header {
    uint64_t file;
    uint64_t size;
};

std::atomic<size_t>* sharedCounter() {
    void* memory = mmap(nullptr, sizeof(std::atomic<size_t>), PROT_READ | PROT_WRITE,
                        MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    return memory == MAP_FAILED ? nullptr : new (memory) std::atomic<size_t>(0);
}

}  // namespace

Jobs::Jobs(int count, Play play, Take take, std::function<void(size_t)> tell)
      : mCount(count),
        mPlay(std::move(play)),
        mTake(std::move(take)),
        mTell(std::move(tell)),
        mNext(sharedCounter()) {}

Jobs::~Jobs() {
    endWorkers();
    if (mNext != nullptr) munmap(mNext, sizeof(*mNext));
}

base::Result<void> Jobs::run(const std::vector<std::string>& names) {
    mResults.clear();
    mHandedOn = 0;
    if (mNext != nullptr) *mNext = 0;
    const size_t count = std::min(static_cast<size_t>(mCount), names.size());
    for (size_t i = 0; i < count; ++i) {
        if (mNext != nullptr && startWorker(names)) continue;
        return base::fail(std::string("cannot start a process: ") + std::strerror(errno),
                          base::kStatusFailed);
    }
    bool isWanted = true;
    while (!mWorkers.empty() && isWanted) {
        std::vector<pollfd> ready;
        for (const Worker& worker : mWorkers) ready.push_back({worker.results, POLLIN, 0});
        poll(ready.data(), ready.size(), -1);
        for (size_t i = ready.size(); i-- > 0;) {
            if (ready[i].revents == 0 || receive(&mWorkers[i])) continue;
            close(mWorkers[i].results);
            waitpid(mWorkers[i].process, nullptr, 0);
            mWorkers.erase(mWorkers.begin() + static_cast<ptrdiff_t>(i));
        }
        isWanted = handOn();
    }
    endWorkers();
    if (!isWanted || mHandedOn == names.size()) return {};
    return base::fail(names[mHandedOn] + ": the process died", base::kStatusFailed);
}

bool Jobs::startWorker(const std::vector<std::string>& names) {
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) return false;
    const pid_t tool = getpid();
    const pid_t process = fork();
    if (process == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (getppid() != tool) _exit(base::kStatusFailed);
        close(ends[0]);
        work(names, ends[1]);
    }
    close(ends[1]);
    if (process < 0) {
        close(ends[0]);
        return false;
    }
    mWorkers.push_back({process, ends[0], {}});
    return true;
}

void Jobs::work(const std::vector<std::string>& names, int results) {
    std::string bytes;
    trace::RecordWriter records([&](std::string_view gathered) { bytes += gathered; });
    // Nothing behind a file that fails is wanted, so this process need not go on.
    bool isPlayed = true;
    for (size_t file; isPlayed && (file = mNext->fetch_add(1)) < names.size(); bytes.clear()) {
        isPlayed = mPlay(names[file], &records);
        records.flush();
        const Header header{file, bytes.size()};
        const bool told = base::writeAll(results, &header, sizeof(header)) &&
                          base::writeAll(results, bytes.data(), bytes.size());
        if (!told) _exit(base::kStatusFailed);
    }
    _exit(0);
}

bool Jobs::receive(Worker* worker) {
    char block[size_t{64} << 10];
    const ssize_t count = read(worker->results, block, sizeof(block));
    if (count < 0) return errno == EINTR;
    if (count == 0) return false;
    std::string& received = worker->received;
    received.append(block, static_cast<size_t>(count));
    for (Header header; received.size() >= sizeof(header);) {
        std::memcpy(&header, received.data(), sizeof(header));
        if (received.size() < sizeof(header) + header.size) break;
        mResults[header.file] = received.substr(sizeof(header), header.size);
        received.erase(0, sizeof(header) + header.size);
        mTell(mHandedOn + mResults.size());
    }
    return true;
}

bool Jobs::handOn() {
    bool isWanted = true;
    for (auto next = mResults.begin();
         isWanted && next != mResults.end() && next->first == mHandedOn;
         next = mResults.erase(next), ++mHandedOn) {
        isWanted = mTake(next->second);
    }
    return isWanted;
}

void Jobs::endWorkers() {
    for (const Worker& worker : mWorkers) {
        kill(worker.process, SIGKILL);
        waitpid(worker.process, nullptr, 0);
        close(worker.results);
    }
    mWorkers.clear();
}

}  // namespace replay
