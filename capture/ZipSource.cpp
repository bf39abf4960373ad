#include "capture/ZipSource.h"

#include <array>
#include <optional>
#include <string_view>

#include <archive.h>
#include <archive_entry.h>
#include <unistd.h>

#include "capture/CaptureText.h"

namespace capture {

namespace {

constexpr size_t kBlock = size_t{64} << 10;
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

}  // namespace

ZipSource::ZipSource(int fd) : mFd(fd) {
    open();
    const std::string name = mError.empty() ? findReport() : "";
    if (!mError.empty()) return;
    archive_read_free(mArchive);
    open();
    if (mError.empty()) openEntry(name);
}

ZipSource::~ZipSource() {
    archive_read_free(mArchive);
    close(mFd);
}

ssize_t ZipSource::read(char* data, size_t size) {
    return readEntry(data, size);
}

ssize_t ZipSource::readEntry(char* data, size_t size) {
    const la_ssize_t count = archive_read_data(mArchive, data, size);
    if (count >= 0) return count;
    fail();
    return -1;
}

// The central directory must be read: the entries' own headers may lack their sizes.
void ZipSource::open() {
    lseek(mFd, 0, SEEK_SET);
    mArchive = archive_read_new();
    archive_read_support_format_zip_seekable(mArchive);
    if (archive_read_open_fd(mArchive, mFd, kBlock) != ARCHIVE_OK) fail();
}

archive_entry* ZipSource::next() {
    archive_entry* entry = nullptr;
    const int status = archive_read_next_header(mArchive, &entry);
    if (status == ARCHIVE_EOF) return nullptr;
    if (status >= ARCHIVE_WARN) return entry;
    fail();
    return nullptr;
}

std::string ZipSource::findReport() {
    std::string report;
    bool hasSeveral = false;
    while (archive_entry* entry = next()) {
        const std::string name = nameOf(entry);
        if (name == kMainEntry) return readName(entry);
        if (!isReport(name)) continue;
        hasSeveral |= !report.empty();
        report = name;
    }
    if (mError.empty() && report.empty()) mError = "no bug report in the zip";
    if (mError.empty() && hasSeveral) mError = "several bug reports in the zip, and none is named";
    return report;
}

std::string ZipSource::readName(archive_entry* entry) {
    if (!isReadable(entry)) return "";
    std::array<char, 4096> text;
    const ssize_t count = readEntry(text.data(), text.size());
    if (count < 0) return "";
    const std::string_view line(text.data(), static_cast<size_t>(count));
    return std::string(trimmed(line.substr(0, line.find('\n'))));
}

void ZipSource::openEntry(const std::string& name) {
    while (archive_entry* entry = next()) {
        if (nameOf(entry) != name) continue;
        isReadable(entry);
        return;
    }
    if (mError.empty()) mError = "the zip lacks the bug report that main_entry.txt names";
}

bool ZipSource::isReadable(archive_entry* entry) {
    if (archive_entry_is_encrypted(entry) != 0) mError = "the zip is encrypted";
    return mError.empty();
}

void ZipSource::fail() {
    const char* text = archive_error_string(mArchive);
    mError = std::string("the zip is damaged: ") + (text != nullptr ? text : "it cannot be read");
}

}  // namespace capture
