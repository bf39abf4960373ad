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
 * Names and values in an SQLite database, in memory or in a file. One thread at a time may use an
 * object. Several processes may use one file, each with an object of its own.
 *
 * The first failure is kept. Later operations still do what they can.
 */
class PropertyStore {
public:
    /** In memory. */
    PropertyStore();

    /**
     * In `file`, which `StoreFile::refuse` has accepted. Turns an empty file, or a store of an
     * earlier build, into a current store. Waits up to 10 s for other processes.
     */
    explicit PropertyStore(std::shared_ptr<const StoreFile> file);

    /** Deletes the log beside the file, unless another process uses the store. */
    ~PropertyStore();

    PropertyStore(const PropertyStore&) = delete;
    PropertyStore& operator=(const PropertyStore&) = delete;

    /** The first failure: one line that names the file. */
    const std::optional<std::string>& error() const { return mError; }

    /** Makes it a failure if the file was deleted or replaced. */
    void checkPlace();

    /** The value; nothing if the name has none. Cuts what other programs stored beyond 91 bytes. */
    std::optional<std::string> get(std::string_view name);

    /** Sets a name that has no value. Returns whether it was this call that set it. */
    bool add(std::string_view name, std::string_view value);

    /** Sets a name. Returns whether that succeeded. */
    bool set(std::string_view name, std::string_view value);

    /** Erases a name, if it is there. Returns whether that succeeded. */
    bool erase(std::string_view name);

    /** Erases all names but `persist.*` and `ro.*`. */
    void eraseVolatile();

    /** The database as bytes. Only in memory. */
    std::vector<unsigned char> save();

    /** Replaces the database by one that `save` returned. Only in memory. */
    void restore(const std::vector<unsigned char>& bytes);

private:
    PropertyStore(std::shared_ptr<const StoreFile> file, const std::string& path);

    void prepareFormat();
    void switchToLog();
    void checkPages();
    void run(const char* sql);
    void prepare(sqlite3_stmt** statement, const char* sql);
    void bind(sqlite3_stmt* statement, int index, std::string_view text);
    bool change(sqlite3_stmt* statement, std::string_view name);
    void check(int status);
    void fail(const std::string& reason);

    // Constant after construction.
    const std::shared_ptr<const StoreFile> mFile;  // null in memory
    sqlite3* mDb = nullptr;
    sqlite3_stmt* mGet = nullptr;

    // Null until they are first run.
    sqlite3_stmt* mAdd = nullptr;
    sqlite3_stmt* mSet = nullptr;
    sqlite3_stmt* mErase = nullptr;

    std::optional<std::string> mError;
};

}  // namespace platform
