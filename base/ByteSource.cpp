#include "base/ByteSource.h"

#include <cerrno>
#include <cstring>

#include <unistd.h>

namespace base {

FileSource::~FileSource() {
    close(mFd);
}

ssize_t FileSource::read(char* data, size_t size) {
    ssize_t count;
    do {
        count = ::read(mFd, data, size);
    } while (count < 0 && errno == EINTR);
    if (count < 0) mError = errno;
    return count;
}

std::string FileSource::error() const {
    return std::string("cannot read: ") + std::strerror(mError);
}

}  // namespace base
