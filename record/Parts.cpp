#include "record/Parts.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace record {

Parts::Error Parts::open(const std::string& folder, size_t bytes) {
    mPath = folder + "/sensor-priv.jsonl";
    mOldPath = folder + "/sensor-priv.old.jsonl";
    mMaxSize = bytes / 2;
    if (Error error = openPart()) return error;
    return cutTornLine();
}

void Parts::close() {
    if (mFd >= 0) ::close(mFd);
    mFd = -1;
}

Parts::Error Parts::startNext() {
    close();
    if (rename(mPath.c_str(), mOldPath.c_str()) != 0) return fail("cannot be renamed");
    return openPart();
}

Parts::Error Parts::write(std::string_view lines) {
    const ssize_t written = ::write(mFd, lines.data(), lines.size());
    if (written != static_cast<ssize_t>(lines.size())) {
        const int reason = written < 0 ? errno : ENOSPC;
        [[maybe_unused]] const int cut = ftruncate(mFd, static_cast<off_t>(mSize));  // or by `open`
        errno = reason;
        return fail("cannot be written");
    }
    mSize += lines.size();
    return {};
}

Parts::Error Parts::openPart() {
    mFd = ::open(mPath.c_str(), O_RDWR | O_CREAT | O_APPEND | O_CLOEXEC, 0640);
    if (mFd < 0) return fail("cannot be opened");
    // Two processes would write two clocks into one trace.
    if (flock(mFd, LOCK_EX | LOCK_NB) != 0) return fail("is written by another process");
    struct stat status {};
    if (fstat(mFd, &status) != 0) return fail("cannot be read");
    mSize = static_cast<size_t>(status.st_size);
    return {};
}

Parts::Error Parts::cutTornLine() {
    const size_t whole = mSize;
    char block[4096];
    while (mSize > 0) {
        const size_t count = mSize < sizeof(block) ? mSize : sizeof(block);
        const auto from = static_cast<off_t>(mSize - count);
        if (pread(mFd, block, count, from) != static_cast<ssize_t>(count)) {
            return fail("cannot be read");
        }
        const void* const end = memrchr(block, '\n', count);
        mSize -= count;
        if (end == nullptr) continue;
        mSize += static_cast<size_t>(static_cast<const char*>(end) - block) + 1;
        break;
    }
    if (mSize == whole || ftruncate(mFd, static_cast<off_t>(mSize)) == 0) return {};
    return fail("cannot be written");
}

Parts::Error Parts::fail(const char* what) {
    std::string error = mPath + ' ' + what + ": " + std::strerror(errno);
    close();
    return error;
}

}  // namespace record
