#include "capture/GzipSource.h"

#include <algorithm>
#include <climits>
#include <utility>

namespace capture {

namespace {

constexpr size_t kBlock = size_t{64} << 10;
constexpr int kGzipOnly = 16;  // as inflateInit2 has it
constexpr Bytef kMagic = 0x1F;

}  // namespace

GzipSource::GzipSource(std::unique_ptr<trace::ByteSource> packed)
      : mPacked(std::move(packed)),
        mBuffer(kBlock) {
    if (inflateInit2(&mStream, MAX_WBITS + kGzipOnly) != Z_OK) mError = "no memory to unpack";
}

GzipSource::~GzipSource() {
    inflateEnd(&mStream);
}

ssize_t GzipSource::read(char* data, size_t size) {
    size = std::min<size_t>(size, INT_MAX);
    mStream.next_out = reinterpret_cast<Bytef*>(data);
    mStream.avail_out = static_cast<uInt>(size);
    while (mError.empty() && mStream.avail_out == size && hasMore()) {
        const int status = inflate(&mStream, Z_NO_FLUSH);
        mEnded = status == Z_STREAM_END;
        if (status == Z_OK || mEnded) continue;
        mError = std::string("the gzip file is damaged: ") +
                 (mStream.msg != nullptr ? mStream.msg : "it cannot be unpacked");
    }
    return mError.empty() ? static_cast<ssize_t>(size - mStream.avail_out) : -1;
}

bool GzipSource::hasMore() {
    if (!fill()) {
        if (!mEnded && mError.empty()) mError = "the gzip file is damaged: it ends early";
        return false;
    }
    if (!mEnded) return true;
    if (*mStream.next_in != kMagic) return false;  // padding
    mEnded = false;
    return inflateReset(&mStream) == Z_OK;
}

bool GzipSource::fill() {
    if (mStream.avail_in > 0) return true;
    const ssize_t count = mPacked->read(mBuffer.data(), mBuffer.size());
    if (count < 0) mError = mPacked->error();
    if (count <= 0) return false;
    mStream.next_in = reinterpret_cast<Bytef*>(mBuffer.data());
    mStream.avail_in = static_cast<uInt>(count);
    return true;
}

}  // namespace capture
