#include "capture/Utf16Source.h"

#include <algorithm>
#include <utility>

namespace capture {

namespace {

constexpr size_t kBlock = size_t{64} << 10;
constexpr size_t kLongest = 4;  // bytes of a character, in either encoding
constexpr unsigned kNoCharacter = 0xFFFD;

constexpr bool isHighHalf(unsigned unit) {
    return (unit & 0xFC00) == 0xD800;
}

constexpr bool isLowHalf(unsigned unit) {
    return (unit & 0xFC00) == 0xDC00;
}

/** Writes `character` at `out` as UTF-8. Returns its end. */
char* writeUtf8(unsigned character, char* out) {
    const auto last = [&](int shift) {
        return static_cast<char>(0x80 | ((character >> shift) & 0x3F));
    };
    if (character < 0x80) {
        *out++ = static_cast<char>(character);
        return out;
    }
    if (character < 0x800) {
        *out++ = static_cast<char>(0xC0 | (character >> 6));
    } else if (character < 0x10000) {
        *out++ = static_cast<char>(0xE0 | (character >> 12));
        *out++ = last(6);
    } else {
        *out++ = static_cast<char>(0xF0 | (character >> 18));
        *out++ = last(12);
        *out++ = last(6);
    }
    *out++ = last(0);
    return out;
}

}  // namespace

bool Utf16Source::isMark(std::string_view start) {
    return start == "\xFF\xFE" || start == "\xFE\xFF";
}

Utf16Source::Utf16Source(std::unique_ptr<trace::ByteSource> text) : mText(std::move(text)) {
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
            out = writeUtf8(takeCharacter(), out);
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

unsigned Utf16Source::unitAt(size_t offset) const {
    const auto byte = [&](size_t index) { return static_cast<unsigned char>(mBuffer[index]); };
    const size_t first = mTaken + offset;
    return mIsBigEndian ? byte(first) << 8U | byte(first + 1) : byte(first + 1) << 8U | byte(first);
}

unsigned Utf16Source::takeCharacter() {
    const size_t left = mBuffer.size() - mTaken;
    const unsigned unit = left < 2 ? kNoCharacter : unitAt(0);
    const bool isPair = isHighHalf(unit) && left >= kLongest && isLowHalf(unitAt(2));
    const unsigned character =
            isPair ? 0x10000 + ((unit & 0x3FF) << 10) + (unitAt(2) & 0x3FF) : unit;
    mTaken += isPair ? kLongest : left < 2 ? left : 2;
    return !isPair && (isHighHalf(unit) || isLowHalf(unit)) ? kNoCharacter : character;
}

}  // namespace capture
