#include "platform/StoreFormat.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string_view>

#include <sqlite3.h>

namespace platform {

namespace {

constexpr uint32_t kApplicationId = 0x53507270;  // "SPrp"
constexpr uint32_t kUserVersion = 1;

/** Compared with the text that SQLite stores: every build has to write it like this. */
constexpr std::string_view kSchema =
        "CREATE TABLE properties (name TEXT PRIMARY KEY, value TEXT NOT NULL) WITHOUT ROWID";

StoreFormat formatFrom(uint32_t applicationId, uint32_t userVersion, const char* schema) {
    const bool isMarked = applicationId == kApplicationId;
    const bool isStore = schema != nullptr && schema == kSchema;
    if (!isMarked && applicationId != 0) return StoreFormat::kForeign;
    if (schema == nullptr && userVersion == 0) return StoreFormat::kEmpty;
    if ((isMarked || isStore) && userVersion > kUserVersion) return StoreFormat::kNewer;
    if (!isStore || userVersion != kUserVersion) return StoreFormat::kForeign;
    return isMarked ? StoreFormat::kCurrent : StoreFormat::kUnmarked;
}

/** SQLite's header holds its numbers big-endian. */
uint32_t numberAt(const unsigned char* bytes) {
    return uint32_t{bytes[0]} << 24 | uint32_t{bytes[1]} << 16 | uint32_t{bytes[2]} << 8 | bytes[3];
}

}  // namespace

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

std::string sqlToCurrent(StoreFormat format) {
    if (format == StoreFormat::kCurrent) return "";
    std::string sql = "PRAGMA application_id = " + std::to_string(kApplicationId) +
                      "; PRAGMA user_version = " + std::to_string(kUserVersion) + ";";
    if (format == StoreFormat::kEmpty) sql += kSchema;
    return sql;
}

StoreHeader readStoreHeader(sqlite3* database) {
    std::array<unsigned char, 100> bytes{};
    sqlite3_file* file = nullptr;
    // Through SQLite: to open and close the file here would drop the locks of this process on it.
    sqlite3_file_control(database, "main", SQLITE_FCNTL_FILE_POINTER, &file);
    file->pMethods->xRead(file, bytes.data(), bytes.size(), 0);
    return {std::memcmp(bytes.data(), "SQLite format 3", 16) == 0,
            numberAt(&bytes[60]) == kUserVersion && numberAt(&bytes[68]) == kApplicationId};
}

}  // namespace platform
