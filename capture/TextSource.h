#pragma once

#include <memory>
#include <string>

#include "trace/ByteSource.h"

namespace capture {

/** What a file turned out to hold. */
struct OpenedText {
    std::unique_ptr<trace::ByteSource> text;
    bool isPlain = true;  // the file's own bytes, which forked processes can read in turn
    std::string error;    // what is wrong, without the file's name; empty if nothing is
};

/**
 * Opens the text in `fd`, a file or a pipe, which it takes over. By its first bytes it is a zip
 * with a bug report, gzip, UTF-16 of either order, or a combination of them; anything else is
 * plain. What comes out is UTF-8 if the text is valid. Memory is constant; a zip from a pipe goes
 * through a temporary file.
 */
OpenedText openText(int fd);

/**
 * A temporary file with all that comes from `source`, open at its start; it has no name. Returns
 * -1, and why in `*error`, if that fails.
 */
int spool(trace::ByteSource* source, std::string* error);

}  // namespace capture
