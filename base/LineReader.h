#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "base/ByteSource.h"

namespace base {

/** `text` without the byte order mark of UTF-8 that it may begin with. */
constexpr std::string_view withoutMark(std::string_view text) {
    constexpr std::string_view kMark = "\xEF\xBB\xBF";
    if (text.substr(0, kMark.size()) == kMark) text.remove_prefix(kMark.size());
    return text;
}

/**
 * Reads a file, or a pipe, line by line and in blocks, in constant memory. Its state lives in
 * memory that forked processes share: a line read by one of them is read for all, so a process can
 * go on where an earlier one ended. Only one process may use it at a time. From a source of another
 * kind only one process may read.
 */
class LineReader {
public:
    /** Readable bytes behind each line, as a vectorised parser wants them. */
    static constexpr size_t kPadding = 64;

    /** Longest line, in bytes without its line feed. */
    static constexpr size_t kMaxLine = size_t{64} << 20;

    /** Reads `fd` from where it stands; takes it over. Throws `std::bad_alloc`. */
    explicit LineReader(int fd);

    explicit LineReader(std::unique_ptr<ByteSource> source);
    ~LineReader();

    LineReader(const LineReader&) = delete;
    LineReader& operator=(const LineReader&) = delete;

    /**
     * The next line without its line feed, valid until the next call; nothing at the end or on an
     * error. The first line comes without a UTF-8 byte order mark.
     */
    std::optional<std::string_view> next();

    /** Whether `next` will not have to wait for input. */
    bool hasLine() const;

    /** Why `next` returned nothing, if not because the input has ended. */
    const std::optional<std::string>& error() const { return mError; }

    /** Whether the last line has no line feed behind it, as a torn one has not. */
    bool isLastOpen() const { return mState->isOpen; }

    /** The number of the line that `next` returned last, or failed at; the first is 1. */
    int64_t lineNumber() const { return mState->lineNumber; }

private:
    struct State {
        int64_t lineNumber;
        size_t begin;  // of the unread bytes in the buffer
        size_t end;
        bool ended;
        bool isOpen;
    };

    char* buffer() const { return reinterpret_cast<char*>(mState + 1); }

    /** Reads another block behind the unread bytes; false on an error. */
    bool fill();

    const std::unique_ptr<ByteSource> mSource;
    State* const mState;  // shared, with the buffer behind it
    std::optional<std::string> mError;
};

}  // namespace base
