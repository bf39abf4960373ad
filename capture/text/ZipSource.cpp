#include "capture/text/ZipSource.h"

#include <array>
#include <string_view>

#include <archive.h>
#include <archive_entry.h>
#include <unistd.h>

#include "capture/text/Block.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr char kMainEntry[] = "main_entry.txt";

std::string nameOf(archive_entry* entry) {
    const char* name = archive_entry_pathname_utf8(entry);
    if (name == nullptr) name = archive_entry_pathname(entry);
    return name != nullptr ? name : "";
}

bool isReport(std::string_view name) {
    return startsWith(name, "bugreport") && endsWith(name, ".txt") &&
           name.find('/') == std::string_view::npos;
}

/** A Mac puts a file of its own beside each one, of the same kind by its name. */
bool isZip(std::string_view name) {
    return endsWith(name, ".zip") && !startsWith(name, "__MACOSX/");
}

/** Of entries of one kind, how many there are and the last one's name. */
struct Candidates {
    size_t count = 0;
    std::string name;

    void add(const std::string& another) {
        ++count;
        name = another;
    }
};

}  // namespace

base::Result<std::unique_ptr<base::ByteSource>> ZipSource::open(int fd) {
    std::unique_ptr<ZipSource> zip(new ZipSource(fd));
    return zip->findReport()
            .and_then([&](const std::string& name) { return zip->find(name); })
            .map([&]() -> std::unique_ptr<base::ByteSource> { return std::move(zip); });
}

ZipSource::~ZipSource() {
    archive_read_free(mArchive);
    close(mFd);
}

ssize_t ZipSource::read(char* data, size_t size) {
    const la_ssize_t count = archive_read_data(mArchive, data, size);
    if (count >= 0) return count;
    mError = damage();
    return -1;
}

// The central directory must be read: the entries' own headers may lack their sizes.
base::Result<void> ZipSource::begin() {
    lseek(mFd, 0, SEEK_SET);
    archive_read_free(mArchive);
    mArchive = archive_read_new();
    archive_read_support_format_zip_seekable(mArchive);
    if (archive_read_open_fd(mArchive, mFd, kBlock) != ARCHIVE_OK) return base::fail(damage());
    return {};
}

base::Result<archive_entry*> ZipSource::next() {
    archive_entry* entry = nullptr;
    mStatus = archive_read_next_header(mArchive, &entry);
    if (mStatus == ARCHIVE_EOF) return nullptr;
    if (mStatus < ARCHIVE_WARN) return base::fail(damage());
    return entry;
}

base::Result<void> ZipSource::checkEntry(archive_entry* entry) const {
    if (archive_entry_is_encrypted(entry) != 0) return base::fail("the zip is encrypted");
    if (mStatus != ARCHIVE_OK) return base::fail(damage());
    if (archive_entry_filetype(entry) != AE_IFREG) {
        return base::fail("the zip is damaged: what should be a text is no file");
    }
    return {};
}

base::Result<std::string> ZipSource::findReport() {
    Candidates reports;
    Candidates zips;
    auto entry = begin().and_then([this] { return next(); });
    for (; entry && *entry != nullptr; entry = next()) {
        const std::string name = nameOf(*entry);
        if (name == kMainEntry) return checkEntry(*entry).and_then([this] { return readName(); });
        if (isReport(name)) reports.add(name);
        if (isZip(name)) zips.add(name);
    }
    if (!entry) return tl::unexpected(entry.error());
    if (reports.count > 1) {
        return base::fail("several bug reports in the zip, and none is named");
    }
    if (reports.count == 1) return reports.name;
    if (zips.count > 1) return base::fail("no bug report in the zip, but several zips");
    if (zips.count == 1) return zips.name;
    return base::fail("no bug report in the zip");
}

base::Result<std::string> ZipSource::readName() {
    std::array<char, 4096> text;
    const ssize_t count = read(text.data(), text.size());
    if (count < 0) return base::fail(mError);
    const std::string_view line(text.data(), static_cast<size_t>(count));
    return std::string(trimmed(line.substr(0, line.find('\n'))));
}

base::Result<void> ZipSource::find(const std::string& name) {
    auto entry = begin().and_then([this] { return next(); });
    while (entry && *entry != nullptr && nameOf(*entry) != name) entry = next();
    if (!entry) return tl::unexpected(entry.error());
    if (*entry == nullptr) {
        return base::fail("the zip lacks the bug report that main_entry.txt names");
    }
    return checkEntry(*entry);
}

std::string ZipSource::damage() const {
    const char* text = archive_error_string(mArchive);
    return std::string("the zip is damaged: ") + (text != nullptr ? text : "it cannot be read");
}

}  // namespace capture
