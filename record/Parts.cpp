#include "record/Parts.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <optional>

#include <fcntl.h>
#include <pthread.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

namespace record {

namespace {

/** How a part begins; 0 stands for any digit. */
constexpr std::string_view kBegin = "# 0000-00-00T00:00:00Z: process ";

constexpr size_t kNoteRoom = 1024;
constexpr size_t kRoom = size_t{64} << 10;  // taken in advance

/** To delete a file of this size takes longer than to start a thread. */
constexpr size_t kLargeFile = size_t{4} << 20;

bool isPart(int fd) {
    char bytes[kBegin.size()];
    const ssize_t count = pread(fd, bytes, sizeof(bytes), 0);
    for (ssize_t i = 0; i < count; ++i) {
        const char expected = kBegin[static_cast<size_t>(i)];
        const bool isDigit = bytes[i] >= '0' && bytes[i] <= '9';
        if (expected == '0' ? !isDigit : bytes[i] != expected) return false;
    }
    return count >= 0;
}

/** What there is to know of an open file. */
struct FileStatus {
    dev_t device = 0;
    uint64_t number = 0;
    bool hasName = false;
    size_t size = 0;
};

/**
 * Asks for no times: a file system that has told them dates the next write anew, which then takes
 * twice as long. Kernels before 4.11 cannot be asked so.
 */
std::optional<FileStatus> statusOf(int fd) {
    struct statx lean {};
    if (statx(fd, "", AT_EMPTY_PATH, STATX_INO | STATX_NLINK | STATX_SIZE, &lean) == 0) {
        return FileStatus{static_cast<dev_t>(makedev(lean.stx_dev_major, lean.stx_dev_minor)),
                          lean.stx_ino, lean.stx_nlink > 0, static_cast<size_t>(lean.stx_size)};
    }
    struct stat full {};
    if (fstat(fd, &full) != 0) return std::nullopt;
    return FileStatus{full.st_dev, full.st_ino, full.st_nlink > 0,
                      static_cast<size_t>(full.st_size)};
}

/** How long a file may become: a longer write would be a signal that ends the process. */
rlim_t fileLimit() {
    rlimit limit{};
    return getrlimit(RLIMIT_FSIZE, &limit) == 0 ? limit.rlim_cur : RLIM_INFINITY;
}

void* closeFile(void* fd) {
    close(static_cast<int>(reinterpret_cast<intptr_t>(fd)));
    return nullptr;
}

/** Closes the last descriptor of a file that has no name any more, which deletes it. */
void closeLast(int fd) {
    const auto status = statusOf(fd);
    // NOLINTNEXTLINE(performance-no-int-to-ptr): a thread takes nothing else
    void* const argument = reinterpret_cast<void*>(intptr_t{fd});
    if (status && status->size < kLargeFile) {
        closeFile(argument);
        return;
    }
    // The host's signals are not for this thread.
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    pthread_t thread{};
    if (pthread_create(&thread, nullptr, closeFile, argument) == 0) {
        pthread_detach(thread);
    } else {
        closeFile(argument);
    }
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

}  // namespace

Error Parts::open(const std::string& folder, size_t bytes) {
    mPath = folder + "/sensor-priv.jsonl";
    mOldPath = folder + "/sensor-priv.old.jsonl";
    mMaxSize = bytes / 2;
    return openPart();
}

Error Parts::resume(size_t bytes) {
    if (findHarm()) return openPart();
    if (Error error = reserve(bytes)) return error;
    cutNote();
    return {};
}

void Parts::abandon() {
    if (mFd >= 0) ::close(mFd);
    mFd = -1;
    mNoteSize = 0;
}

void Parts::close() {
    // Gives back the room that was taken in advance, too.
    if (!findHarm()) cutNote();
    abandon();
}

void Parts::cutNote() {
    [[maybe_unused]] const int cut = ftruncate(mFd, static_cast<off_t>(mSize));
    mNoteSize = 0;
    mReserved = 0;
}

Error Parts::findHarm() {
    if (mFd < 0) return complain(mPath, "is closed");
    const auto status = statusOf(mFd);
    if (!status || status->device != mDevice || status->number != mNumber) {
        mFd = -1;  // somebody else's by now
        return complain(mPath, "was closed by the host");
    }
    mIsGone = !status->hasName || status->size < mSize + mNoteSize;
    if (!status->hasName) return fail("was removed");
    if (mIsGone) return fail("was cut");
    mSize = status->size - mNoteSize;  // a child may have added to it
    return {};
}

Error Parts::startNext() {
    int old = -1;
    if (Error error = openOwnFile(mOldPath, &old)) return error;
    Error error;
    struct stat named {};
    // A part that was given another name keeps it.
    const bool hasName =
            lstat(mPath.c_str(), &named) == 0 && named.st_dev == mDevice && named.st_ino == mNumber;
    if (!isPart(old)) {
        error = complain(mOldPath, "is no part of a record");
    } else if (hasName &&
               (unlink(mOldPath.c_str()) != 0 || rename(mPath.c_str(), mOldPath.c_str()) != 0)) {
        // To rename it over a file may first write it to the disk.
        error = complain(mPath, "cannot be renamed", errno);
    } else {
        close();
        error = openPart();
    }
    closeLast(old);
    return error;
}

Error Parts::write(std::string_view lines) {
    if (Error error = reserve(lines.size())) return error;
    if (!append(lines)) {
        const int reason = errno;
        [[maybe_unused]] const int cut = ftruncate(mFd, static_cast<off_t>(mSize));  // or by `open`
        return complain(mPath, "cannot be written", reason);
    }
    mSize += lines.size();
    return {};
}

void Parts::writeNote(std::string_view line) {
    if (findHarm() || line.size() > kNoteRoom || fileLimit() < mSize + line.size()) return;
    if (append(line)) {
        mNoteSize = line.size();
    } else {
        [[maybe_unused]] const int cut = ftruncate(mFd, static_cast<off_t>(mSize));
    }
}

void Parts::writeBeside(std::string_view line) const {
    int fd = -1;
    if (openOwnFile(mPath, &fd)) return;
    struct stat status {};
    if (isPart(fd) && fstat(fd, &status) == 0 &&
        fileLimit() >= static_cast<size_t>(status.st_size) + line.size()) {
        [[maybe_unused]] const ssize_t written = ::write(fd, line.data(), line.size());
    }
    ::close(fd);
}

bool Parts::append(std::string_view text) const {
    const ssize_t written = ::write(mFd, text.data(), text.size());
    if (written >= 0 && written < static_cast<ssize_t>(text.size())) errno = ENOSPC;
    return written == static_cast<ssize_t>(text.size());
}

/** Makes sure that `bytes` and a note can be written, and that nobody dies of trying. */
Error Parts::reserve(size_t bytes) {
    const size_t needed = mSize + bytes + kNoteRoom;
    const rlim_t limit = fileLimit();
    if (limit < needed) return complain(mPath, "cannot be written", EFBIG);
    if (needed <= mReserved) return {};
    for (const size_t more : {needed + kRoom, needed}) {
        const auto end = static_cast<size_t>(std::min<rlim_t>(more, limit));
        const int status = fallocate(mFd, FALLOC_FL_KEEP_SIZE, static_cast<off_t>(mSize),
                                     static_cast<off_t>(end - mSize));
        // A file system that cannot do this says so in one of many ways.
        if (status == 0 || (errno != ENOSPC && errno != EDQUOT)) {
            mReserved = end;
            return {};
        }
    }
    return complain(mPath, "cannot be written", errno);
}

Error Parts::openPart() {
    mReserved = 0;
    mIsGone = false;
    if (Error error = openOwnFile(mPath, &mFd)) {
        mFd = -1;
        return error;
    }
    // Two processes would write two clocks into one trace.
    if (flock(mFd, LOCK_EX | LOCK_NB) != 0) return fail("is written by another process");
    if (!isPart(mFd)) return fail("is no part of a record");
    if (Error error = hideFromOthers(mPath, mFd)) {
        abandon();
        return error;
    }
    const auto status = statusOf(mFd);
    if (!status) return fail("cannot be read", errno);
    mDevice = status->device;
    mNumber = status->number;
    mSize = status->size;
    return cutTornLine();
}

Error Parts::cutTornLine() {
    const size_t whole = mSize;
    char block[4096];
    while (mSize > 0) {
        const size_t count = mSize < sizeof(block) ? mSize : sizeof(block);
        const auto from = static_cast<off_t>(mSize - count);
        if (pread(mFd, block, count, from) != static_cast<ssize_t>(count)) {
            return fail("cannot be read", errno);
        }
        const void* const end = memrchr(block, '\n', count);
        mSize -= count;
        if (end == nullptr) continue;
        mSize += static_cast<size_t>(static_cast<const char*>(end) - block) + 1;
        break;
    }
    if (mSize == whole || ftruncate(mFd, static_cast<off_t>(mSize)) == 0) return {};
    return fail("cannot be written", errno);
}

Error Parts::fail(const char* what, int reason) {
    abandon();
    return complain(mPath, what, reason);
}

}  // namespace record
