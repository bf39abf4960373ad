#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <string>

namespace android {

/**
 * A name that threads write and read without a lock. Holds up to 1023 bytes and cuts longer names
 * there.
 *
 * Any thread may call any operation. None waits. A `get` during a `set` may return a mix of both
 * names. Two `set`s at once may leave a mix behind.
 */
class SharedText {
public:
    explicit SharedText(const std::string& text);

    void set(const std::string& text);
    std::string get() const;

private:
    static constexpr size_t kMaxBytes = 1023;

    // The storage never moves, so that a race can only mix bytes.
    std::array<std::atomic<char>, kMaxBytes> mBytes{};
    std::atomic<size_t> mSize{0};
};

}  // namespace android
