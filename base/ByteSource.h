#pragma once

#include <cstddef>
#include <string>

#include <sys/types.h>

namespace base {

/** Bytes that are read from their start to their end. */
class ByteSource {
public:
    virtual ~ByteSource() = default;

    /** Reads at most `size` bytes, at least one. Returns how many; 0 at the end, -1 on an error. */
    virtual ssize_t read(char* data, size_t size) = 0;

    /** Why the last `read` failed. */
    virtual std::string error() const = 0;
};

/** A file, from where it stands, or a pipe. */
class FileSource : public ByteSource {
public:
    /** Takes `fd` over. */
    explicit FileSource(int fd) : mFd(fd) {}
    ~FileSource() override;

    FileSource(const FileSource&) = delete;
    FileSource& operator=(const FileSource&) = delete;

    ssize_t read(char* data, size_t size) override;
    std::string error() const override;

    int fd() const { return mFd; }

private:
    const int mFd;
    int mError = 0;
};

}  // namespace base
