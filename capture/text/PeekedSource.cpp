#include "capture/text/PeekedSource.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace capture {

PeekedSource::PeekedSource(std::unique_ptr<base::ByteSource> source) : mSource(std::move(source)) {
    constexpr std::string_view kFirst = "P\x1F\xFF\xFE";
    while (mCount < mStart.size()) {
        const ssize_t count = mSource->read(&mStart[mCount], 1);
        mFailed = count < 0;
        if (count <= 0 || kFirst.find(mStart[mCount++]) == std::string_view::npos) break;
    }
}

ssize_t PeekedSource::read(char* data, size_t size) {
    const size_t known = std::min(size, mCount - mTaken);
    if (known == 0) return mFailed ? -1 : mSource->read(data, size);
    std::memcpy(data, &mStart[mTaken], known);
    mTaken += known;
    return static_cast<ssize_t>(known);
}

}  // namespace capture
