#pragma once

#include <array>
#include <memory>
#include <string>
#include <string_view>

#include "trace/ByteSource.h"

namespace capture {

/** A source whose first bytes tell what it holds, before they are read. */
class PeekedSource : public trace::ByteSource {
public:
    explicit PeekedSource(std::unique_ptr<trace::ByteSource> source);

    /** The first two bytes; only the first, or none, where no archive or encoding begins so. */
    std::string_view start() const { return {mStart.data(), mCount}; }

    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mSource->error(); }

private:
    const std::unique_ptr<trace::ByteSource> mSource;
    std::array<char, 2> mStart{};
    size_t mCount = 0;  // of the first bytes
    size_t mTaken = 0;  // of those, read again
};

}  // namespace capture
