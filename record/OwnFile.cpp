#include "record/OwnFile.h"

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace record {

namespace {

constexpr mode_t kMode = 0600;

}  // namespace

std::string complain(const std::string& path, const char* what, int reason) {
    std::string text = path + ' ' + what;
    return reason == 0 ? text : text + ": " + std::strerror(reason);
}

Error openOwnFile(const std::string& path, int* fd) {
    struct stat status {};
    // First without opening it: that alone would wake whoever waits at the other end of a FIFO.
    const bool isThere = lstat(path.c_str(), &status) == 0;
    if (isThere && !S_ISREG(status.st_mode)) return complain(path, "is no regular file");
    const int flags = O_RDWR | O_CREAT | O_APPEND | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY;
    *fd = open(path.c_str(), flags, kMode);
    if (*fd < 0) return complain(path, "cannot be opened", errno);
    Error error;
    if (fstat(*fd, &status) != 0) {
        error = complain(path, "cannot be read", errno);
    } else if (!S_ISREG(status.st_mode)) {
        error = complain(path, "is no regular file");
    }
    if (error) close(*fd);
    return error;
}

Error hideFromOthers(const std::string& path, int fd) {
    return fchmod(fd, kMode) == 0 ? Error() : complain(path, "is not ours", errno);
}

}  // namespace record
