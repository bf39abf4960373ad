#include "base/FileIo.h"

#include <cerrno>

#include <unistd.h>

namespace base {

bool writeAll(int fd, const void* data, size_t size) {
    const char* next = static_cast<const char*>(data);
    while (size > 0) {
        const ssize_t count = write(fd, next, size);
        if (count < 0 && errno == EINTR) continue;
        if (count < 0) return false;
        next += count;
        size -= static_cast<size_t>(count);
    }
    return true;
}

std::vector<unsigned char> readAll(int fd) {
    std::vector<unsigned char> bytes;
    unsigned char block[4096];
    for (;;) {
        const ssize_t count = read(fd, block, sizeof(block));
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return bytes;
        bytes.insert(bytes.end(), block, block + count);
    }
}

}  // namespace base
