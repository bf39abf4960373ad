#include "platform/StoreFile.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string_view>

#include <fcntl.h>
#include <sqlite3.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {

namespace {

constexpr uint32_t kApplicationId = 0x53507270;  // "SPrp"
constexpr uint32_t kUserVersion = 1;

constexpr char kReplaced[] = "it was deleted or replaced while it was in use";

/** The first bytes of an SQLite file: big-endian numbers at fixed places. */
class DatabaseHeader {
public:
    explicit DatabaseHeader(sqlite3* database) {
        sqlite3_file* file = nullptr;
        sqlite3_file_control(database, "main", SQLITE_FCNTL_FILE_POINTER, &file);
        file->pMethods->xRead(file, mBytes.data(), mBytes.size(), 0);
    }

    bool isSound() const { return std::memcmp(mBytes.data(), "SQLite format 3", 16) == 0; }
    bool isMarked() const { return numberAt(60) == kUserVersion && numberAt(68) == kApplicationId; }

private:
    uint32_t numberAt(size_t place) const {
        return uint32_t{mBytes[place]} << 24 | uint32_t{mBytes[place + 1]} << 16 |
               uint32_t{mBytes[place + 2]} << 8 | mBytes[place + 3];
    }

    std::array<unsigned char, 100> mBytes{};
};

StoreFormat formatFrom(uint32_t applicationId, uint32_t userVersion, const char* schema) {
    const bool isMarked = applicationId == kApplicationId;
    const bool isStore = schema != nullptr && std::string_view(schema) == kStoreSchema;
    if (!isMarked && applicationId != 0) return StoreFormat::kForeign;
    if (schema == nullptr && userVersion == 0) return StoreFormat::kEmpty;
    if ((isMarked || isStore) && userVersion > kUserVersion) return StoreFormat::kNewer;
    if (!isStore || userVersion != kUserVersion) return StoreFormat::kForeign;
    return isMarked ? StoreFormat::kCurrent : StoreFormat::kUnmarked;
}

/** O_PATH needs no permission, never blocks, and a close drops no lock of this process. */
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

/** `path` as an SQLite URI, which reads without a change of any file. */
std::string readOnlyUri(const std::string& path) {
    constexpr char kHex[] = "0123456789ABCDEF";
    std::string uri = "file:";
    for (const unsigned char byte : path) {
        uri += '%';
        uri += kHex[byte >> 4];
        uri += kHex[byte & 15];
    }
    // A write-ahead log can only be read with the index beside it; without one, the file by itself
    // is all there is to see.
    std::error_code error;
    const bool hasLog = std::filesystem::exists(path + "-wal", error) &&
                        std::filesystem::exists(path + "-shm", error);
    return uri + (hasLog ? "?mode=ro&readonly_shm=1" : "?mode=ro&immutable=1");
}

}  // namespace

const char kStoreSchema[] =
        "CREATE TABLE properties (name TEXT PRIMARY KEY, value TEXT NOT NULL) WITHOUT ROWID";

const char kStoreMarks[] = "PRAGMA application_id = 0x53507270; PRAGMA user_version = 1";

StoreFormat formatOf(sqlite3* database, int* status) {
    sqlite3_stmt* statement = nullptr;
    *status = sqlite3_prepare_v2(database,
                                 "SELECT (SELECT * FROM pragma_application_id),"
                                 " (SELECT * FROM pragma_user_version),"
                                 " (SELECT group_concat(sql, ';') FROM sqlite_schema)",
                                 -1, &statement, nullptr);
    if (*status != SQLITE_OK) return StoreFormat::kForeign;
    const std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)> owner(statement, sqlite3_finalize);
    *status = sqlite3_step(statement);
    if (*status != SQLITE_ROW) return StoreFormat::kForeign;
    *status = SQLITE_OK;
    return formatFrom(static_cast<uint32_t>(sqlite3_column_int(statement, 0)),
                      static_cast<uint32_t>(sqlite3_column_int(statement, 1)),
                      reinterpret_cast<const char*>(sqlite3_column_text(statement, 2)));
}

std::optional<std::string> refuseFormat(StoreFormat format) {
    if (format == StoreFormat::kNewer) return "a property store of a newer version";
    if (format == StoreFormat::kForeign) return "not a property store";
    return std::nullopt;
}

namespace {

/** Why what the database holds is no store, if so. */
std::optional<std::string> judge(sqlite3* database) {
    const DatabaseHeader header(database);
    if (!header.isSound()) return refuseFormat(StoreFormat::kForeign);
    int status = SQLITE_OK;
    const StoreFormat format = formatOf(database, &status);
    // Whoever is making the store, or was killed at that, has marked it before the rest is there.
    if (status != SQLITE_OK && header.isMarked()) return std::nullopt;
    if (status != SQLITE_OK) return sqlite3_errstr(status);
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
    if (const auto reason = look()) return refusal(*reason);
    return std::nullopt;
}

std::optional<std::string> StoreFile::refuseIfReplaced() const {
    struct stat status {};
    const bool hasContent = fstat(mFd, &status) == 0 && status.st_size > 0;
    if (isInPlace() && hasContent && !look()) return std::nullopt;
    return refusal(kReplaced);
}

bool StoreFile::isInPlace() const {
    struct stat held {};
    struct stat named {};
    return fstat(mFd, &held) == 0 && stat(mAbsolutePath.c_str(), &named) == 0 &&
           held.st_dev == named.st_dev && held.st_ino == named.st_ino;
}

std::optional<std::string> StoreFile::look() const {
    struct stat status {};
    if (fstat(mFd, &status) != 0) return std::strerror(errno);
    if (!S_ISREG(status.st_mode)) return "not a regular file";
    if (status.st_size == 0) return std::nullopt;
    sqlite3* database = nullptr;
    const int error = sqlite3_open_v2(readOnlyUri(mAbsolutePath).c_str(), &database,
                                      SQLITE_OPEN_READONLY | SQLITE_OPEN_URI, nullptr);
    const auto refused = error == SQLITE_OK ? judge(database) : sqlite3_errstr(error);
    sqlite3_close(database);
    return refused;
}

}  // namespace platform
