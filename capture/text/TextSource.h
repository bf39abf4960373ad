#pragma once

#include <memory>

#include "base/ByteSource.h"
#include "base/Result.h"

namespace capture {

/** What a file turned out to hold. */
struct OpenedText {
    std::unique_ptr<base::ByteSource> text;
    bool isPlain = true;  // the file's own bytes, which forked processes can read in turn
};

/**
 * Opens the text in `fd`, a file or a pipe, which it takes over. The first bytes tell what it is:
 *
 * - a zip with a bug report, or gzip: unpacked. What comes out may be packed once more, as reports
 *   are that were mailed in another zip; deeper is a failure, so that a file that holds itself
 *   ends;
 * - UTF-16 of either order, packed or not: made UTF-8;
 * - anything else: left as it is, also if it is no valid UTF-8.
 *
 * Fails, without the file's name, if the file cannot be opened as what it says it is. What is wrong
 * further behind fails the `read` that comes to it: no damage ends a text as if it were whole.
 *
 * Memory is constant. A zip from a pipe, or in another file, goes through a temporary file without
 * a name; if that cannot be written, the status is `kStatusFailed`.
 */
base::Result<OpenedText> openText(int fd);

}  // namespace capture
