#pragma once

#include <memory>
#include <string>
#include <vector>

#include <zlib.h>

#include "base/ByteSource.h"

namespace capture {

/**
 * What a gzip file holds; several in a row are one. Its checksums are verified, which libarchive
 * leaves out, and without which most damage would pass unseen. Zeros behind it are padding, as
 * tapes and disks leave it. Anything else behind it is an error, and so is an early end.
 */
class GzipSource : public base::ByteSource {
public:
    explicit GzipSource(std::unique_ptr<base::ByteSource> packed);
    ~GzipSource() override;

    GzipSource(const GzipSource&) = delete;
    GzipSource& operator=(const GzipSource&) = delete;

    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mError; }

private:
    /** Whether there is more to unpack: the rest of this file, or another one behind it. */
    bool hasMore();

    /** Reads packed bytes if none are left; false at their end or on an error. */
    bool fill();

    /** Reads the zeros behind the last file; anything else there is an error. */
    void skipPadding();

    const std::unique_ptr<base::ByteSource> mPacked;
    std::vector<char> mBuffer;
    z_stream mStream{};
    bool mEnded = false;  // the last file has
    std::string mError;
};

}  // namespace capture
