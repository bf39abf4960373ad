#include "platform/StoreFile.h"

#include <cerrno>
#include <cstring>
#include <filesystem>

#include <fcntl.h>
#include <sqlite3.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/StoreFormat.h"

namespace platform {

namespace {

constexpr char kReplaced[] = "it was deleted or replaced while it was in use";

/** O_PATH needs no permission and never blocks. Closing it drops no lock of this process. */
int openPath(const std::string& path) {
    int fd = open(path.c_str(), O_PATH | O_CLOEXEC);
    if (fd >= 0 || errno != ENOENT) return fd;
    fd = open(path.c_str(), O_RDONLY | O_CREAT | O_NONBLOCK | O_NOCTTY | O_CLOEXEC, 0644);
    if (fd < 0) return fd;
    close(fd);
    return open(path.c_str(), O_PATH | O_CLOEXEC);
}

std::string absolute(const std::string& path) {
    std::error_code error;
    return path.empty() ? "/" : std::filesystem::absolute(path, error).string();
}

/** `path` as a URI by which SQLite reads without changing any file. */
std::string readOnlyUri(const std::string& path) {
    constexpr char kHex[] = "0123456789ABCDEF";
    std::string uri = "file:";
    for (const unsigned char byte : path) {
        uri += '%';
        uri += kHex[byte >> 4];
        uri += kHex[byte & 15];
    }
    // SQLite needs the index to read a log without writing. Where either is missing, it reads the
    // file alone: "immutable" keeps it from creating the two.
    std::error_code error;
    const bool hasLog = std::filesystem::exists(path + "-wal", error) &&
                        std::filesystem::exists(path + "-shm", error);
    return uri + (hasLog ? "?mode=ro&readonly_shm=1" : "?mode=ro&immutable=1");
}

/** Why the database cannot be opened as a store, if so. */
std::optional<std::string> refuseDatabase(sqlite3* database) {
    const StoreHeader header = readStoreHeader(database);
    if (!header.isDatabase) return refuseFormat(StoreFormat::kForeign);
    int status = SQLITE_OK;
    const StoreFormat format = formatOf(database, &status);
    // Whoever is creating the store, or was killed at it, wrote the first page first: the mark.
    if (status != SQLITE_OK && header.isMarked) return std::nullopt;
    if (status != SQLITE_OK) return sqlite3_errstr(status);
    // An empty database is not an empty file: another program has made it.
    return refuseFormat(format == StoreFormat::kEmpty ? StoreFormat::kForeign : format);
}

}  // namespace

StoreFile::StoreFile(const std::string& path)
      : mPath(path),
        mAbsolutePath(absolute(path)),
        mFd(openPath(path)),
        mErrno(errno) {}

StoreFile::~StoreFile() {
    if (mFd >= 0) close(mFd);
}

std::string StoreFile::refusal(const std::string& reason) const {
    return mPath + ": cannot keep properties in this file: " + reason;
}

std::optional<std::string> StoreFile::refuse() const {
    if (mFd < 0) return refusal(std::strerror(mErrno));
    if (!isInPlace()) return refusal(kReplaced);
    if (const auto reason = refuseContent()) return refusal(*reason);
    return std::nullopt;
}

std::optional<std::string> StoreFile::refuseIfReplaced() const {
    struct stat status {};
    const bool hasContent = fstat(mFd, &status) == 0 && status.st_size > 0;
    if (isInPlace() && hasContent && !refuseContent()) return std::nullopt;
    return refusal(kReplaced);
}

bool StoreFile::isInPlace() const {
    struct stat held {};
    struct stat named {};
    return fstat(mFd, &held) == 0 && stat(mAbsolutePath.c_str(), &named) == 0 &&
           held.st_dev == named.st_dev && held.st_ino == named.st_ino;
}

std::optional<std::string> StoreFile::refuseContent() const {
    struct stat status {};
    if (fstat(mFd, &status) != 0) return std::strerror(errno);
    if (!S_ISREG(status.st_mode)) return "not a regular file";
    if (status.st_size == 0) return std::nullopt;
    sqlite3* database = nullptr;
    const int error = sqlite3_open_v2(readOnlyUri(mAbsolutePath).c_str(), &database,
                                      SQLITE_OPEN_READONLY | SQLITE_OPEN_URI, nullptr);
    auto reason = error == SQLITE_OK ? refuseDatabase(database) : sqlite3_errstr(error);
    sqlite3_close(database);
    return reason;
}

}  // namespace platform
