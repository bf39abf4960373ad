#include "capture/text/GzipSource.h"

#include <algorithm>
#include <climits>
#include <utility>

#include "capture/text/Block.h"

namespace capture {

namespace {

constexpr int kGzipOnly = 16;  // as inflateInit2 has it
constexpr Bytef kMagic = 0x1F;
constexpr char kDamaged[] = "the gzip file is damaged: ";

}  // namespace

GzipSource::GzipSource(std::unique_ptr<base::ByteSource> packed)
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
        mError = kDamaged +
                 std::string(mStream.msg != nullptr ? mStream.msg : "it cannot be unpacked");
    }
    return mError.empty() ? static_cast<ssize_t>(size - mStream.avail_out) : -1;
}

bool GzipSource::hasMore() {
    if (!fill()) {
        if (!mEnded && mError.empty()) mError = kDamaged + std::string("it ends early");
        return false;
    }
    if (!mEnded) return true;
    if (*mStream.next_in != kMagic) {
        skipPadding();
        return false;
    }
    mEnded = false;
    inflateReset(&mStream);
    return true;
}

void GzipSource::skipPadding() {
    for (; fill(); mStream.avail_in = 0) {
        Bytef* const end = mStream.next_in + mStream.avail_in;
        if (std::any_of(mStream.next_in, end, [](Bytef byte) { return byte != 0; })) {
            mError = kDamaged + std::string("something else follows it");
            return;
        }
    }
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
