#pragma once

#include <cstdio>
#include <optional>
#include <string>
#include <vector>

#include <sys/types.h>

#include "base/Result.h"

namespace base {

/**
 * A file that a run makes. What stands at its path stays until `commit`: a run that fails, or is
 * killed, leaves the old file as it was and no other file.
 *
 *  - A regular file, or none, is replaced by a rename; the new one has the mode of the old one.
 *  - A link is followed: its target is replaced.
 *  - What is no regular file, a terminal or a pipe for instance, is written straight. So is the
 *    file that standard output or standard error is.
 */
class OutputFile {
public:
    /** Opens the file for `path`, which must be writable. Fails with "PATH: cannot write: ...". */
    static Result<OutputFile> create(const std::string& path);

    /** Leaves the old file, if the new one was not committed. */
    ~OutputFile();

    OutputFile(OutputFile&& other) noexcept;
    OutputFile& operator=(OutputFile&&) = delete;

    /** What is written goes here. Errors show in `commit`. */
    std::FILE* file() const { return mFile; }

    /** What is wrong, by `errno`, after a write that failed. */
    Failure failure() const;

    /** Puts the file at its path. Nothing may be written afterwards. */
    Result<void> commit();

private:
    OutputFile(std::string path, std::string target, std::FILE* file)
          : mPath(std::move(path)),
            mTarget(std::move(target)),
            mFile(file) {}

    std::string mPath;       // as it was given
    std::string mTarget;     // what is replaced; empty if the file is written straight
    std::string mTemporary;  // the new file's name beside it; empty if it has none yet
    std::FILE* mFile = nullptr;
};

/** A file that a command line names, and for what. */
struct NamedFile {
    std::string use;   // "--page", or "the input"
    std::string path;  // "-" is standard input, if it is read
    bool isWritten = false;
};

/**
 * Whether a file that is written is another one of `files` too, by whatever name: then what is
 * wrong. Terminals and devices like /dev/null may be named more than once.
 */
std::optional<Failure> findClash(const std::vector<NamedFile>& files);

}  // namespace base
