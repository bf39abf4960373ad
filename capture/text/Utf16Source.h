#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "base/ByteSource.h"

namespace capture {

/**
 * UTF-16 text with a byte order mark, as UTF-8 without one. Windows shells write such files when
 * they redirect what adb prints. A half of a pair without its other half, and a byte left over at
 * the end, become U+FFFD each; neither is an error.
 */
class Utf16Source : public base::ByteSource {
public:
    /** Whether a text that starts with these two bytes is UTF-16. */
    static bool isMark(std::string_view start);

    /** `text` comes with its byte order mark. */
    explicit Utf16Source(std::unique_ptr<base::ByteSource> text);

    /** `size` must be at least 4, the bytes of the longest character. */
    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mText->error(); }

private:
    /** Reads more behind the bytes that are left; false on an error. */
    bool fill();

    /** The unit `offset` bytes behind what was converted; U+FFFD if the text ends within it. */
    uint16_t unitAt(size_t offset) const;

    /** Converts the next character, of which there is at least a byte, to `out`. Returns its end.
     */
    char* convert(char* out);

    const std::unique_ptr<base::ByteSource> mText;
    std::string mBuffer;
    size_t mTaken = 0;  // of the buffer
    bool mEnded = false;
    bool mIsBigEndian = false;
};

}  // namespace capture
