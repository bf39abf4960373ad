#include "base/LineReader.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <new>
#include <utility>

#include <sys/mman.h>

namespace base {

namespace {

constexpr size_t kBlock = size_t{256} << 10;
constexpr size_t kCapacity = LineReader::kMaxLine + kBlock;

constexpr char kTooLong[] = "the line is longer than 64 MiB";

/** Pages of shared memory that are never touched cost nothing. */
void* mapShared(size_t size) {
    void* memory = mmap(nullptr, size, PROT_READ | PROT_WRITE,
                        MAP_SHARED | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    return memory == MAP_FAILED ? nullptr : memory;
}

}  // namespace

LineReader::LineReader(int fd) : LineReader(std::make_unique<FileSource>(fd)) {}

LineReader::LineReader(std::unique_ptr<ByteSource> source)
      : mSource(std::move(source)),
        mState(static_cast<State*>(mapShared(sizeof(State) + kCapacity + kPadding))) {
    if (mState == nullptr) throw std::bad_alloc();
}

LineReader::~LineReader() {
    munmap(mState, sizeof(State) + kCapacity + kPadding);
}

std::optional<std::string_view> LineReader::next() {
    if (mError) return std::nullopt;
    ++mState->lineNumber;
    size_t searched = 0;
    for (;;) {
        char* const begin = buffer() + mState->begin;
        const size_t unread = mState->end - mState->begin;
        const void* feed = std::memchr(begin + searched, '\n', unread - searched);
        if (feed == nullptr && !mState->ended) {
            searched = unread;
            if (!fill()) return std::nullopt;
            continue;
        }
        if (feed == nullptr && unread == 0) return std::nullopt;
        const size_t length = feed == nullptr
                                      ? unread
                                      : static_cast<size_t>(static_cast<const char*>(feed) - begin);
        if (length > kMaxLine) {
            mError = kTooLong;
            return std::nullopt;
        }
        mState->begin += std::min(length + 1, unread);
        mState->isOpen = feed == nullptr;
        const std::string_view line(begin, length);
        return mState->lineNumber == 1 ? withoutMark(line) : line;
    }
}

bool LineReader::hasLine() const {
    return mState->ended ||
           std::memchr(buffer() + mState->begin, '\n', mState->end - mState->begin) != nullptr;
}

bool LineReader::fill() {
    std::memmove(buffer(), buffer() + mState->begin, mState->end - mState->begin);
    mState->end -= mState->begin;
    mState->begin = 0;
    if (mState->end > kMaxLine) {
        mError = kTooLong;
        return false;
    }
    const ssize_t count = mSource->read(buffer() + mState->end, kBlock);
    if (count < 0) {
        mError = mSource->error();
        return false;
    }
    mState->ended = count == 0;
    mState->end += static_cast<size_t>(count);
    return true;
}

}  // namespace base
