#include "capture/PeekedSource.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace capture {

PeekedSource::PeekedSource(std::unique_ptr<trace::ByteSource> source) : mSource(std::move(source)) {
    // Who types a text gets an answer to the first line, however short it is.
    constexpr std::string_view kFirst = "P\x1F\xFF\xFE";
    while (mCount < mStart.size() && mSource->read(&mStart[mCount], 1) == 1) {
        if (kFirst.find(mStart[mCount++]) == std::string_view::npos) break;
    }
}

ssize_t PeekedSource::read(char* data, size_t size) {
    const size_t known = std::min(size, mCount - mTaken);
    if (known == 0) return mSource->read(data, size);
    std::memcpy(data, &mStart[mTaken], known);
    mTaken += known;
    return static_cast<ssize_t>(known);
}

}  // namespace capture
