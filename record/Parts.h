#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace record {

/**
 * The files of a record in a folder: the part that grows, "sensor-priv.jsonl", and the one before
 * it, "sensor-priv.old.jsonl". Every process adds to the part that grows. When that is full, it
 * takes the place of the older one, which is given up.
 *
 * A part ends with a whole line at any time, also when the process is killed: each write is one
 * system call, what fails in the middle of it is taken back, and `open` takes back what a crash of
 * the device has cut off.
 *
 * Operations return nothing, or what is wrong; the files are then closed. Not safe for threads by
 * itself.
 */
class Parts {
public:
    using Error = std::optional<std::string>;

    Parts() = default;
    ~Parts() { close(); }
    Parts(const Parts&) = delete;
    Parts& operator=(const Parts&) = delete;

    /** Goes on with the part in `folder`; both parts together get `bytes` at most. */
    Error open(const std::string& folder, size_t bytes);

    void close();
    bool isOpen() const { return mFd >= 0; }
    const std::string& path() const { return mPath; }

    /** Whether `bytes` more would be too much for the part. An empty part takes everything. */
    bool isFullFor(size_t bytes) const { return mSize > 0 && mSize + bytes > mMaxSize; }

    /** Begins a new part. */
    Error startNext();

    /** Adds whole lines. */
    Error write(std::string_view lines);

private:
    Error openPart();
    Error cutTornLine();
    Error fail(const char* what);

    std::string mPath;
    std::string mOldPath;
    size_t mMaxSize = 0;
    int mFd = -1;
    size_t mSize = 0;  // bytes
};

}  // namespace record
