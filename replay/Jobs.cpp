#include "replay/Jobs.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <new>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/FileIo.h"
#include "base/Result.h"

namespace replay {

namespace {

/** What stands in front of a file's output in a worker's pipe. */
struct Header {
    uint64_t file;
    uint64_t size;  // of the texts, each behind its own size
    int32_t status;
};

std::atomic<size_t>* sharedCounter() {
    void* memory = mmap(nullptr, sizeof(std::atomic<size_t>), PROT_READ | PROT_WRITE,
                        MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    return memory == MAP_FAILED ? nullptr : new (memory) std::atomic<size_t>(0);
}

/** Makes `fd` a memory file; what is printed there can then be taken out by `takeOutput`. */
bool gather(int fd) {
    const int file = memfd_create("output", MFD_CLOEXEC);
    return file >= 0 && dup2(file, fd) == fd && close(file) == 0;
}

std::vector<unsigned char> takeOutput(int fd) {
    lseek(fd, 0, SEEK_SET);
    std::vector<unsigned char> bytes = base::readAll(fd);
    lseek(fd, 0, SEEK_SET);
    if (ftruncate(fd, 0) != 0) _exit(base::kStatusFailed);
    return bytes;
}

}  // namespace

Jobs::Jobs(int count, std::vector<int> outputs, Work work, std::function<void(size_t)> tell)
      : mCount(count),
        mOutputs(std::move(outputs)),
        mWork(std::move(work)),
        mTell(std::move(tell)),
        mNext(sharedCounter()) {}

Jobs::~Jobs() {
    endWorkers();
    if (mNext != nullptr) munmap(mNext, sizeof(*mNext));
}

int Jobs::run(const std::vector<std::string>& names) {
    mResults.clear();
    mPrinted = 0;
    if (mNext != nullptr) *mNext = 0;
    const size_t count = std::min(static_cast<size_t>(mCount), names.size());
    for (size_t i = 0; i < count; ++i) {
        if (mNext != nullptr && startWorker(names)) continue;
        std::fprintf(stderr, "cannot start a process: %s\n", std::strerror(errno));
        return base::kStatusFailed;
    }
    int status = 0;
    while (!mWorkers.empty() && status == 0) {
        std::vector<pollfd> ready;
        for (const Worker& worker : mWorkers) ready.push_back({worker.results, POLLIN, 0});
        poll(ready.data(), ready.size(), -1);
        for (size_t i = ready.size(); i-- > 0;) {
            if (ready[i].revents == 0 || receive(&mWorkers[i])) continue;
            close(mWorkers[i].results);
            waitpid(mWorkers[i].process, nullptr, 0);
            mWorkers.erase(mWorkers.begin() + static_cast<ptrdiff_t>(i));
        }
        status = printDone();
    }
    endWorkers();
    if (status != 0 || mPrinted == names.size()) return status;
    std::fprintf(stderr, "%s: the process died\n", names[mPrinted].c_str());
    return base::kStatusFailed;
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
    for (const int output : mOutputs) {
        if (!gather(output)) _exit(base::kStatusFailed);
    }
    int status = 0;
    // Nothing behind a file that fails is printed, so this process need not go on.
    for (size_t file; status == 0 && (file = mNext->fetch_add(1)) < names.size();) {
        status = mWork(names[file]);
        std::string texts;
        for (const int output : mOutputs) {
            const auto bytes = takeOutput(output);
            const uint64_t size = bytes.size();
            texts.append(reinterpret_cast<const char*>(&size), sizeof(size));
            texts.append(bytes.begin(), bytes.end());
        }
        const Header header{file, texts.size(), status};
        const bool told = base::writeAll(results, &header, sizeof(header)) &&
                          base::writeAll(results, texts.data(), texts.size());
        if (!told) _exit(base::kStatusFailed);
    }
    _exit(0);
}

std::vector<std::string> Jobs::takeApart(const char* texts) const {
    std::vector<std::string> parts;
    for (size_t i = 0; i < mOutputs.size(); ++i) {
        uint64_t size = 0;
        std::memcpy(&size, texts, sizeof(size));
        parts.emplace_back(texts + sizeof(size), size);
        texts += sizeof(size) + size;
    }
    return parts;
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
        mResults[header.file] = {header.status, takeApart(received.data() + sizeof(header))};
        received.erase(0, sizeof(header) + header.size);
        mTell(mPrinted + mResults.size());
    }
    return true;
}

int Jobs::printDone() {
    for (auto done = mResults.begin(); done != mResults.end() && done->first == mPrinted;
         done = mResults.erase(done), ++mPrinted) {
        const auto& [status, texts] = done->second;
        for (size_t i = 0; i < texts.size(); ++i) {
            if (base::writeAll(mOutputs[i], texts[i].data(), texts[i].size())) continue;
            std::fprintf(stderr, "cannot write %s: %s\n",
                         mOutputs[i] == STDOUT_FILENO ? "standard output" : "an output",
                         std::strerror(errno));
            return base::kStatusFailed;
        }
        if (status != 0) return status;
    }
    return 0;
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
