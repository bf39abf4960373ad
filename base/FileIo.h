#pragma once

#include <cstddef>
#include <vector>

namespace base {

/** Writes all of it; false, with `errno`, if that fails. */
bool writeAll(int fd, const void* data, size_t size);

/** What can be read up to the end, or up to an error. */
std::vector<unsigned char> readAll(int fd);

}  // namespace base
