#pragma once

#include <array>
#include <memory>
#include <string>
#include <string_view>

#include "base/ByteSource.h"

namespace capture {

/**
 * A source whose first bytes tell what it holds, before they are read.
 *
 * The constructor reads them one at a time, and the second only where the first may begin an
 * archive or an encoding: who types a text gets an answer to the first line, however short it is.
 * An error among them is kept for the `read` that comes to it.
 */
class PeekedSource : public base::ByteSource {
public:
    explicit PeekedSource(std::unique_ptr<base::ByteSource> source);

    /** The first two bytes; only the first, or none, where no archive or encoding begins so. */
    std::string_view start() const { return {mStart.data(), mCount}; }

    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mSource->error(); }

private:
    const std::unique_ptr<base::ByteSource> mSource;
    std::array<char, 2> mStart{};
    size_t mCount = 0;     // of the first bytes
    size_t mTaken = 0;     // of those, read again
    bool mFailed = false;  // behind them
};

}  // namespace capture
