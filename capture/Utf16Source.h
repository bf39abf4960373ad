#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "trace/ByteSource.h"

namespace capture {

/** UTF-16 text with a byte order mark as UTF-8. What is no character becomes U+FFFD. */
class Utf16Source : public trace::ByteSource {
public:
    /** Whether a text that starts with these two bytes is UTF-16. */
    static bool isMark(std::string_view start);

    /** `text` comes with its byte order mark. */
    explicit Utf16Source(std::unique_ptr<trace::ByteSource> text);

    /** `size` must be at least 4. */
    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mText->error(); }

private:
    /** Reads more behind the bytes that are left; false on an error. */
    bool fill();

    /** The unit that begins `offset` bytes behind what was converted. */
    unsigned unitAt(size_t offset) const;

    /** The next character, taken off what was read; a lone half is U+FFFD. */
    unsigned takeCharacter();

    const std::unique_ptr<trace::ByteSource> mText;
    std::string mBuffer;
    size_t mTaken = 0;  // of the buffer
    bool mEnded = false;
    bool mIsBigEndian = false;
};

}  // namespace capture
