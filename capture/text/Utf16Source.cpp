#include "capture/text/Utf16Source.h"

#include <algorithm>
#include <utility>

#include <unistr.h>

#include "capture/text/Block.h"

namespace capture {

namespace {

constexpr size_t kLongest = 4;  // bytes of a character, in either encoding
constexpr uint16_t kNoCharacter = 0xFFFD;

}  // namespace

bool Utf16Source::isMark(std::string_view start) {
    return start == "\xFF\xFE" || start == "\xFE\xFF";
}

Utf16Source::Utf16Source(std::unique_ptr<base::ByteSource> text) : mText(std::move(text)) {
    while (mBuffer.size() < 2 && !mEnded && fill()) continue;
    mIsBigEndian = !mBuffer.empty() && mBuffer[0] == '\xFE';
    mTaken = std::min<size_t>(mBuffer.size(), 2);
}

ssize_t Utf16Source::read(char* data, size_t size) {
    char* out = data;
    do {
        if (mBuffer.size() - mTaken < kLongest && !mEnded && !fill()) return -1;
        while (data + size - out >= static_cast<ptrdiff_t>(kLongest) &&
               mBuffer.size() - mTaken >= (mEnded ? 1 : kLongest)) {
            out = convert(out);
        }
    } while (out == data && !mEnded);
    return out - data;
}

bool Utf16Source::fill() {
    mBuffer.erase(0, std::exchange(mTaken, 0));
    const size_t left = mBuffer.size();
    mBuffer.resize(left + kBlock);
    const ssize_t count = mText->read(mBuffer.data() + left, kBlock);
    mBuffer.resize(left + static_cast<size_t>(count > 0 ? count : 0));
    mEnded = count == 0;
    return count >= 0;
}

uint16_t Utf16Source::unitAt(size_t offset) const {
    const size_t first = mTaken + offset;
    if (mBuffer.size() < first + 2) return kNoCharacter;
    const auto high = static_cast<unsigned char>(mBuffer[first + (mIsBigEndian ? 0 : 1)]);
    const auto low = static_cast<unsigned char>(mBuffer[first + (mIsBigEndian ? 1 : 0)]);
    return static_cast<uint16_t>(high << 8U | low);
}

char* Utf16Source::convert(char* out) {
    const uint16_t units[] = {unitAt(0), unitAt(2)};
    ucs4_t character;
    const int count = u16_mbtouc(&character, units, 2);
    mTaken = std::min(mTaken + static_cast<size_t>(count) * 2, mBuffer.size());
    return out + u8_uctomb(reinterpret_cast<uint8_t*>(out), character, kLongest);
}

}  // namespace capture
