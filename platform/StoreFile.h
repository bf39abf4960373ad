#pragma once

#include <optional>
#include <string>

struct sqlite3;

namespace platform {

/** What an SQLite database is to the property service. */
enum class StoreFormat {
    kEmpty,     // nothing in it yet
    kCurrent,   // a property store
    kUnmarked,  // a property store of an earlier build, which has no application id
    kNewer,     // a property store that a later build has changed
    kForeign,   // anything else
};

/** The table of a property store, as its schema holds it. */
extern const char kStoreSchema[];

/** Marks a property store: its application id and its user version. */
extern const char kStoreMarks[];

/** The format of an open database. Sets `*status` to SQLite's error, if there is one. */
StoreFormat formatOf(sqlite3* database, int* status);

/** Why a database of this format is refused, if it is. */
std::optional<std::string> refuseFormat(StoreFormat format);

/**
 * The file of a property store, known by its inode from construction to destruction. Objects of
 * this class may be inherited by forked processes, and leave SQLite's locks on the file alone.
 */
class StoreFile {
public:
    /** Makes the file, empty, if it is missing. */
    explicit StoreFile(const std::string& path);
    ~StoreFile();

    StoreFile(const StoreFile&) = delete;
    StoreFile& operator=(const StoreFile&) = delete;

    /** As it was given. */
    const std::string& path() const { return mPath; }

    /** For SQLite, to which some names mean something else. */
    const std::string& absolutePath() const { return mAbsolutePath; }

    /** "FILE: cannot keep properties in this file: ", then `reason`. */
    std::string refusal(const std::string& reason) const;

    /**
     * Why the file cannot keep properties, if that shows without writing: one line that names it.
     * Neither the file nor what stands beside it changes.
     */
    std::optional<std::string> refuse() const;

    /** The same of a store in use: its path still has to name it, and a store has to be in it. */
    std::optional<std::string> refuseIfReplaced() const;

private:
    bool isInPlace() const;
    std::optional<std::string> look() const;

    const std::string mPath;
    const std::string mAbsolutePath;
    const int mFd;
    const int mErrno;  // of the open, if `mFd` is negative
};

}  // namespace platform
