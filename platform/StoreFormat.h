#pragma once

#include <optional>
#include <string>

struct sqlite3;

namespace platform {

/** What an SQLite database is to the property service. */
enum class StoreFormat {
    kEmpty,     // it has no table and no mark
    kCurrent,   // a property store
    kUnmarked,  // a property store of an earlier build, without the mark
    kNewer,     // a property store of a later build
    kForeign,   // another program's database
};

/**
 * The format of an open database. SQLite's application id and user version mark a store; both are 0
 * in a new database. Sets `*status` to SQLite's status; after an error the result means nothing.
 */
StoreFormat formatOf(sqlite3* database, int* status);

/** Why a database of this format cannot be used. Nothing for the first three formats. */
std::optional<std::string> refuseFormat(StoreFormat format);

/** SQL that turns a database of this format into a current store. For the first three formats. */
std::string sqlToCurrent(StoreFormat format);

/** What the first bytes of an open database's file tell, whatever state its pages are in. */
struct StoreHeader {
    bool isDatabase;  // it is an SQLite file
    bool isMarked;    // it carries the mark of a current store
};

StoreHeader readStoreHeader(sqlite3* database);

}  // namespace platform
