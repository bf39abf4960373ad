#include "base/OutputFile.h"

#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <map>
#include <utility>

#include <fcntl.h>
#include <libgen.h>
#include <sys/stat.h>
#include <unistd.h>

namespace base {

namespace {

constexpr int kMostLinks = 40;  // as the kernel has it

tl::unexpected<Failure> cannotWrite(const std::string& path) {
    return fail(path + ": cannot write: " + std::strerror(errno));
}

std::string directoryOf(std::string path) {
    return dirname(path.data());
}

/** The path at the end of the links at `path`, whether there is a file or not. */
std::string followLinks(std::string path) {
    std::array<char, PATH_MAX> link;
    for (int i = 0; i < kMostLinks; ++i) {
        const ssize_t size = readlink(path.c_str(), link.data(), link.size());
        if (size < 0) break;
        const std::string target(link.data(), static_cast<size_t>(size));
        path = target.substr(0, 1) == "/" ? target : directoryOf(path) + '/' + target;
    }
    return path;
}

bool isSameFile(const struct stat& a, const struct stat& b) {
    return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

/** The standard stream that is the file `info`; -1 if none is. */
int streamOf(const struct stat& info) {
    for (const int fd : {STDOUT_FILENO, STDERR_FILENO}) {
        struct stat stream {};
        if (fstat(fd, &stream) == 0 && isSameFile(stream, info)) return fd;
    }
    return -1;
}

/** A file in `directory` that has no name yet; where there are none such, one named `*name`. */
int createTemporary(const std::string& directory, std::string* name) {
    const int fd = open(directory.c_str(), O_TMPFILE | O_WRONLY | O_CLOEXEC, 0666);
    if (fd >= 0 || (errno != EOPNOTSUPP && errno != EISDIR && errno != EINVAL)) return fd;
    *name = directory + "/.sensor-replay-XXXXXX";
    const int named = mkostemp(name->data(), O_CLOEXEC);
    if (named < 0) {
        name->clear();
        return -1;
    }
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(named, 0666 & ~mask);
    return named;
}

/** Gives a file without a name one beside `target`. Returns the name; empty, with `errno`, if not.
 */
std::string nameBeside(const std::string& target, int fd) {
    const std::string source = "/proc/self/fd/" + std::to_string(fd);
    for (int i = 0;; ++i) {
        std::string name = directoryOf(target) + "/.sensor-replay-" + std::to_string(getpid()) +
                           '-' + std::to_string(i);
        if (linkat(AT_FDCWD, source.c_str(), AT_FDCWD, name.c_str(), AT_SYMLINK_FOLLOW) == 0) {
            return name;
        }
        if (errno != EEXIST) return {};
    }
}

}  // namespace

Result<OutputFile> OutputFile::create(const std::string& path) {
    struct stat info {};
    const bool exists = stat(path.c_str(), &info) == 0;
    if (exists && S_ISDIR(info.st_mode)) {
        errno = EISDIR;
        return cannotWrite(path);
    }
    const int stream = exists ? streamOf(info) : -1;
    const bool isStraight = exists && (stream >= 0 || !S_ISREG(info.st_mode));
    // A rename asks only for the folder's permission.
    if (exists && access(path.c_str(), W_OK) != 0) return cannotWrite(path);
    std::string target;
    std::string temporary;
    int fd = -1;
    if (stream >= 0) {
        fd = fcntl(stream, F_DUPFD_CLOEXEC, 0);
    } else if (isStraight) {
        fd = open(path.c_str(), O_WRONLY | O_CLOEXEC);
    } else {
        target = followLinks(path);
        fd = createTemporary(directoryOf(target), &temporary);
    }
    std::FILE* const file = fd < 0 ? nullptr : fdopen(fd, "w");
    if (file == nullptr) return cannotWrite(path);
    if (exists && !isStraight) {
        // Only root can give a file away; whoever cannot keeps it.
        if (fchown(fd, info.st_uid, info.st_gid) != 0) errno = 0;
        fchmod(fd, info.st_mode & 07777);
    }
    OutputFile output(path, std::move(target), file);
    output.mTemporary = std::move(temporary);
    return output;
}

OutputFile::OutputFile(OutputFile&& other) noexcept
      : mPath(std::move(other.mPath)),
        mTarget(std::move(other.mTarget)),
        mTemporary(std::exchange(other.mTemporary, {})),
        mFile(std::exchange(other.mFile, nullptr)) {}

OutputFile::~OutputFile() {
    if (mFile != nullptr) std::fclose(mFile);
    if (!mTemporary.empty()) unlink(mTemporary.c_str());
}

Failure OutputFile::failure() const {
    return cannotWrite(mPath).value();
}

Result<void> OutputFile::commit() {
    bool isGood = std::fflush(mFile) == 0 && std::ferror(mFile) == 0;
    if (isGood && !mTarget.empty() && mTemporary.empty()) {
        mTemporary = nameBeside(mTarget, fileno(mFile));
        isGood = !mTemporary.empty();
    }
    // A full disk may show as late as here.
    isGood = std::fclose(std::exchange(mFile, nullptr)) == 0 && isGood;
    if (isGood && !mTarget.empty()) {
        isGood = std::rename(mTemporary.c_str(), mTarget.c_str()) == 0;
        if (isGood) mTemporary.clear();
    }
    if (!isGood) return cannotWrite(mPath);
    return {};
}

std::optional<Failure> findClash(const std::vector<NamedFile>& files) {
    // A file that is there is known by its number, another one by its folder's and its name.
    std::map<std::pair<std::pair<dev_t, ino_t>, std::string>, const NamedFile*> seen;
    for (const bool written : {false, true}) {
        for (const NamedFile& each : files) {
            if (each.isWritten != written) continue;
            const bool isInput = !written && each.path == "-";
            struct stat info {};
            std::string name;
            if ((isInput ? fstat(STDIN_FILENO, &info) : stat(each.path.c_str(), &info)) != 0) {
                std::string target = followLinks(each.path);
                if (stat(directoryOf(target).c_str(), &info) != 0) continue;
                name = basename(target.data());
            } else if (S_ISCHR(info.st_mode)) {
                continue;
            }
            const auto [found, isNew] = seen.insert({{{info.st_dev, info.st_ino}, name}, &each});
            if (isNew || !written) continue;
            return Failure{each.use + ' ' + each.path + ": is the same file as " +
                           found->second->use + ' ' + found->second->path};
        }
    }
    return std::nullopt;
}

}  // namespace base
