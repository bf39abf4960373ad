#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <string>

namespace android {

/**
 * A name that several threads write and read without a lock.
 *
 * It holds up to 1023 bytes, NULs included. A longer name is cut there.
 *
 * All operations may be called from any thread at any time and never wait. A call that runs beside
 * a `set` may return a mix of the old name and the new one. Two `set`s that run at once may leave
 * such a mix behind until the next `set`.
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
