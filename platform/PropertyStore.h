#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/StoreFile.h"

struct sqlite3;
struct sqlite3_stmt;

namespace platform {

/**
 * Names and values in an SQLite database, in memory or in a file. The first failure is remembered;
 * operations after it still do what they can. To be used by one thread at a time; several processes
 * may use one file.
 */
class PropertyStore {
public:
    /** In memory. */
    PropertyStore();

    /** In a file that `StoreFile::refuse` has no objection to. */
    explicit PropertyStore(std::shared_ptr<const StoreFile> file);

    ~PropertyStore();

    PropertyStore(const PropertyStore&) = delete;
    PropertyStore& operator=(const PropertyStore&) = delete;

    /** The first failure: one line that names the file. */
    const std::optional<std::string>& error() const { return mError; }

    /** Notes a failure if the file was deleted or replaced. */
    void checkPlace();

    /** The value, cut at 91 bytes: other programs may have stored longer ones. */
    std::optional<std::string> get(std::string_view name);

    /** Sets what is not set yet. Returns whether it did. */
    bool add(std::string_view name, std::string_view value);

    /** Both return whether they succeeded. */
    bool set(std::string_view name, std::string_view value);
    bool erase(std::string_view name);

    /** Erases all but `persist.*` and `ro.*`. */
    void eraseVolatile();

    /** The whole database as bytes, and the way back. Only in memory. */
    std::vector<unsigned char> save();
    void restore(const std::vector<unsigned char>& bytes);

private:
    PropertyStore(std::shared_ptr<const StoreFile> file, const std::string& path);

    void prepareFormat();
    void switchToLog();
    void checkPages();
    void run(const char* sql);
    sqlite3_stmt* prepare(const char* sql);
    void bind(sqlite3_stmt* statement, int index, std::string_view text);
    bool change(sqlite3_stmt* statement, std::string_view name);
    void check(int status);
    void fail(const std::string& reason);

    const std::shared_ptr<const StoreFile> mFile;  // null in memory
    sqlite3* mDb = nullptr;
    sqlite3_stmt* mGet = nullptr;
    sqlite3_stmt* mAdd = nullptr;
    sqlite3_stmt* mSet = nullptr;
    sqlite3_stmt* mErase = nullptr;
    std::optional<std::string> mError;
};

}  // namespace platform
