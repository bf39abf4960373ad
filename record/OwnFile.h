#pragma once

#include <optional>
#include <string>

namespace record {

/** Nothing, or what is wrong: one line that names the file. */
using Error = std::optional<std::string>;

/** `path`, what is wrong with it, and, if that is not 0, the meaning of `reason`, an errno. */
std::string complain(const std::string& path, const char* what, int reason = 0);

/**
 * Opens the file `path` for reading, appending and locking. It is made if it is missing, with the
 * mode 0600. Neither waits for anybody nor follows a link: what is no regular file is refused. The
 * descriptor is closed by `exec`.
 */
Error openOwnFile(const std::string& path, int* fd);

/** Gives an open file that has turned out to be ours the mode 0600. */
Error hideFromOthers(const std::string& path, int fd);

}  // namespace record
