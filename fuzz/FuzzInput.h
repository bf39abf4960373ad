#pragma once

#include <cstddef>
#include <cstdint>

#include <sys/mman.h>
#include <unistd.h>

#include "base/FileIo.h"

namespace fuzz {

/** A file with these bytes, open at its start; who takes it closes it. */
inline int readable(const uint8_t* data, size_t size) {
    const int fd = memfd_create("input", MFD_CLOEXEC);
    base::writeAll(fd, data, size);
    lseek(fd, 0, SEEK_SET);
    return fd;
}

}  // namespace fuzz
