#pragma once

#include <memory>
#include <string>
#include <vector>

#include "trace/ByteSource.h"

struct archive;
struct archive_entry;

namespace capture {

/**
 * The bug report's text in a zip as a device writes it: the entry that `main_entry.txt` names, or
 * without that the only text in the root whose name begins with "bugreport".
 */
class ZipSource : public trace::ByteSource {
public:
    /** Takes `fd` over, which must allow to seek. After an error only `error` may be called. */
    explicit ZipSource(int fd);
    ~ZipSource() override;

    ZipSource(const ZipSource&) = delete;
    ZipSource& operator=(const ZipSource&) = delete;

    ssize_t read(char* data, size_t size) override;

    /** What is wrong; empty after the constructor if nothing is. */
    std::string error() const override { return mError; }

private:
    /** Begins at the archive's first entry. */
    void open();

    /** The next entry, nullptr at the end or after an error. */
    archive_entry* next();

    /** The name of the entry with the report; empty after an error. */
    std::string findReport();
    std::string readName(archive_entry* entry);
    ssize_t readEntry(char* data, size_t size);
    void openEntry(const std::string& name);

    /** Sets the error if the entry is encrypted. */
    bool isReadable(archive_entry* entry);
    void fail();

    const int mFd;
    archive* mArchive = nullptr;
    std::string mError;
};

}  // namespace capture
