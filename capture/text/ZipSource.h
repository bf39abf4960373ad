#pragma once

#include <memory>
#include <string>

#include "base/ByteSource.h"
#include "base/Result.h"

struct archive;
struct archive_entry;

namespace capture {

/**
 * The bug report in a zip as a device writes it, or in one that such a zip was mailed in: the entry
 * that `main_entry.txt` names; without that the only text in the root whose name begins with
 * "bugreport"; without that the only zip, which comes out as it is.
 *
 * Other entries are not read, so damage in them does no harm. In what is read, damage is an error:
 * headers that contradict the directory at the archive's end, a wrong size or checksum. The last
 * two show only at the entry's end, so a text is whole only when `read` has returned 0.
 */
class ZipSource : public base::ByteSource {
public:
    /** Takes `fd` over, which must allow to seek. */
    static base::Result<std::unique_ptr<base::ByteSource>> open(int fd);

    ~ZipSource() override;

    ZipSource(const ZipSource&) = delete;
    ZipSource& operator=(const ZipSource&) = delete;

    ssize_t read(char* data, size_t size) override;
    std::string error() const override { return mError; }

private:
    explicit ZipSource(int fd) : mFd(fd) {}

    /** Begins at the archive's first entry. */
    base::Result<void> begin();

    /** The next entry, nullptr at the end. */
    base::Result<archive_entry*> next();

    /** Whether the data of the entry that came last may be read. */
    base::Result<void> checkEntry(archive_entry* entry) const;

    /** The name of the entry with the report. */
    base::Result<std::string> findReport();

    /** What the entry `main_entry.txt`, which came last, names. */
    base::Result<std::string> readName();

    /** Goes to the entry `name`. */
    base::Result<void> find(const std::string& name);

    /** Why the archive library failed. */
    std::string damage() const;

    const int mFd;
    archive* mArchive = nullptr;
    int mStatus = 0;     // of the entry that came last, as the archive library has it
    std::string mError;  // of `read`
};

}  // namespace capture
