#include "platform/PropertyStore.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include <sqlite3.h>
#include <sys/system_properties.h>

#include "platform/StoreFormat.h"

namespace platform {

namespace {

/** How long a process waits for others that use the file. */
constexpr int kBusyMs = 10'000;

/** What SQLite sets up once is there in processes that are forked later. */
[[maybe_unused]] const int kInitialised = sqlite3_initialize();

}  // namespace

PropertyStore::PropertyStore() : PropertyStore(nullptr, ":memory:") {}

PropertyStore::PropertyStore(std::shared_ptr<const StoreFile> file)
      : PropertyStore(file, file->absolutePath()) {}

PropertyStore::PropertyStore(std::shared_ptr<const StoreFile> file, const std::string& path)
      : mFile(std::move(file)) {
    check(sqlite3_open_v2(path.c_str(), &mDb, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE, nullptr));
    sqlite3_busy_timeout(mDb, kBusyMs);
    // SQLite opens a file that cannot be written for reading, and would leave a log beside it.
    if (sqlite3_db_readonly(mDb, "main") == 1) check(SQLITE_READONLY);
    // No sync: the kernel keeps what a killed process has written. Only a power cut loses writes.
    run("PRAGMA synchronous = OFF");
    prepareFormat();
    if (mFile != nullptr) switchToLog();
    // Now: what is stored can still be read when a write has failed.
    prepare(&mGet, "SELECT value FROM properties WHERE name = ?1");
}

PropertyStore::~PropertyStore() {
    for (sqlite3_stmt* statement : {mGet, mAdd, mSet, mErase}) sqlite3_finalize(statement);
    sqlite3_close(mDb);
}

void PropertyStore::checkPlace() {
    if (mFile != nullptr && !mError) mError = mFile->refuseIfReplaced();
}

std::optional<std::string> PropertyStore::get(std::string_view name) {
    std::optional<std::string> value;
    bind(mGet, 1, name);
    const int status = sqlite3_step(mGet);
    if (status == SQLITE_ROW) {
        const unsigned char* text = sqlite3_column_text(mGet, 0);
        const auto size = static_cast<size_t>(sqlite3_column_bytes(mGet, 0));
        value.emplace(reinterpret_cast<const char*>(text),
                      std::min(size, size_t{PROP_VALUE_MAX} - 1));
    } else if (status != SQLITE_DONE) {
        check(status);
    }
    sqlite3_reset(mGet);
    return value;
}

bool PropertyStore::add(std::string_view name, std::string_view value) {
    prepare(&mAdd, "INSERT INTO properties VALUES (?1, ?2) ON CONFLICT (name) DO NOTHING");
    bind(mAdd, 2, value);
    return change(mAdd, name) && sqlite3_changes(mDb) == 1;
}

bool PropertyStore::set(std::string_view name, std::string_view value) {
    prepare(&mSet,
            "INSERT INTO properties VALUES (?1, ?2)"
            " ON CONFLICT (name) DO UPDATE SET value = excluded.value");
    bind(mSet, 2, value);
    return change(mSet, name);
}

bool PropertyStore::erase(std::string_view name) {
    prepare(&mErase, "DELETE FROM properties WHERE name = ?1");
    return change(mErase, name);
}

void PropertyStore::eraseVolatile() {
    run("DELETE FROM properties WHERE name NOT GLOB 'persist.*' AND name NOT GLOB 'ro.*'");
}

std::vector<unsigned char> PropertyStore::save() {
    sqlite3_int64 size = 0;
    unsigned char* bytes = sqlite3_serialize(mDb, "main", &size, 0);
    std::vector<unsigned char> copy(bytes, bytes + size);
    sqlite3_free(bytes);
    return copy;
}

void PropertyStore::restore(const std::vector<unsigned char>& bytes) {
    auto* copy = static_cast<unsigned char*>(sqlite3_malloc64(bytes.size()));
    std::memcpy(copy, bytes.data(), bytes.size());
    const auto size = static_cast<sqlite3_int64>(bytes.size());
    check(sqlite3_deserialize(mDb, "main", copy, size, size,
                              SQLITE_DESERIALIZE_FREEONCLOSE | SQLITE_DESERIALIZE_RESIZEABLE));
}

/**
 * Comes before the switch to the log, so that a new store's mark is in the file itself, whatever
 * becomes of the log. Also finds out whether the file can be written.
 */
void PropertyStore::prepareFormat() {
    if (mFile == nullptr) {  // a store in memory is new, and has no pages to damage
        run(sqlToCurrent(StoreFormat::kEmpty).c_str());
        return;
    }
    run("BEGIN IMMEDIATE");
    if (mError) return;
    int status = SQLITE_OK;
    const StoreFormat format = formatOf(mDb, &status);
    check(status);
    if (const auto refusal = refuseFormat(format)) {
        fail(*refusal);
        // The log that told of it stays as it is, too.
        sqlite3_db_config(mDb, SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
    }
    checkPages();
    run(sqlToCurrent(format).c_str());
    run("COMMIT");
}

/**
 * With a write-ahead log each write is one append. The busy timeout does not cover this switch: it
 * fails at once while another process makes it too.
 */
void PropertyStore::switchToLog() {
    int status = mError ? SQLITE_OK : SQLITE_BUSY;
    for (int waited = 0; status == SQLITE_BUSY && waited < kBusyMs; ++waited) {
        if (waited > 0) sqlite3_sleep(1);
        status = sqlite3_exec(mDb, "PRAGMA journal_mode = WAL", nullptr, nullptr, nullptr);
    }
    check(status);
}

/** Without this, a damaged page would show only when it is read. */
void PropertyStore::checkPages() {
    sqlite3_stmt* statement = nullptr;
    prepare(&statement, "PRAGMA quick_check(1)");
    if (mError) return;
    const int status = sqlite3_step(statement);
    if (status != SQLITE_ROW) {
        check(status);
    } else if (reinterpret_cast<const char*>(sqlite3_column_text(statement, 0)) !=
               std::string_view("ok")) {
        check(SQLITE_CORRUPT);
    }
    sqlite3_finalize(statement);
}

/** Does nothing if something has failed before. */
void PropertyStore::run(const char* sql) {
    if (!mError) check(sqlite3_exec(mDb, sql, nullptr, nullptr, nullptr));
}

/** Prepares `*statement` if it is null. Leaves it so if something has failed before. */
void PropertyStore::prepare(sqlite3_stmt** statement, const char* sql) {
    if (*statement == nullptr && !mError) {
        check(sqlite3_prepare_v2(mDb, sql, -1, statement, nullptr));
    }
}

/** `text` must stay valid until the statement is reset. */
void PropertyStore::bind(sqlite3_stmt* statement, int index, std::string_view text) {
    check(sqlite3_bind_text(statement, index, text.data(), static_cast<int>(text.size()),
                            SQLITE_STATIC));
}

bool PropertyStore::change(sqlite3_stmt* statement, std::string_view name) {
    bind(statement, 1, name);
    const int status = sqlite3_step(statement);
    if (status != SQLITE_DONE) check(status);
    sqlite3_reset(statement);
    return status == SQLITE_DONE;
}

void PropertyStore::check(int status) {
    if (status != SQLITE_OK) fail(sqlite3_errstr(status));
}

void PropertyStore::fail(const std::string& reason) {
    if (mError) return;
    mError = mFile != nullptr ? mFile->refusal(reason) : "cannot keep properties: " + reason;
}

}  // namespace platform
