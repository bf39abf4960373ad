#pragma once

#include <optional>
#include <string>

namespace platform {

/**
 * The file of a property store. An object stands for one inode from its construction on. Forked
 * processes may go on to use it. It never touches SQLite's locks on the file.
 */
class StoreFile {
public:
    /** Opens `path`. Creates an empty file if there is none. `refuse` reports a failure. */
    explicit StoreFile(const std::string& path);
    ~StoreFile();

    StoreFile(const StoreFile&) = delete;
    StoreFile& operator=(const StoreFile&) = delete;

    /** The path as given. */
    const std::string& path() const { return mPath; }

    /** The path for SQLite, which gives some relative names a meaning of their own. */
    const std::string& absolutePath() const { return mAbsolutePath; }

    /** The line that reports `reason` to a person: "PATH: cannot keep properties …: REASON". */
    std::string refusal(const std::string& reason) const;

    /**
     * Checks the file before it is opened as a store. Returns nothing if it is a store or empty.
     * Otherwise returns one line that names it. Changes neither the file nor those beside it.
     */
    std::optional<std::string> refuse() const;

    /**
     * Checks the file while it is in use as a store. Returns nothing if the path still names it and
     * it still holds a store. Otherwise returns one line that names it.
     */
    std::optional<std::string> refuseIfReplaced() const;

private:
    bool isInPlace() const;
    std::optional<std::string> refuseContent() const;

    const std::string mPath;
    const std::string mAbsolutePath;
    const int mFd;     // pins the inode: its number is not given to another file
    const int mErrno;  // of the open, if `mFd` is negative
};

}  // namespace platform
