#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include <sys/types.h>

#include "record/OwnFile.h"

namespace record {

/**
 * The files of a record in a folder: the part that grows, "sensor-priv.jsonl", and the one before
 * it, "sensor-priv.old.jsonl". Every process adds to the part that grows. When that is full, it
 * takes the place of the older one, which is given up. A file of either name that is no part of a
 * record is refused, and keeps every byte.
 *
 * Each write is one system call, and what fails in the middle of it is taken back. A process that
 * is killed in it may leave the beginning of a line, which `open` takes back.
 *
 * A part has some room on the disk in advance, so that a note fits when the disk is full.
 *
 * Not safe for threads by itself.
 */
class Parts {
public:
    Parts() = default;
    ~Parts() { close(); }
    Parts(const Parts&) = delete;
    Parts& operator=(const Parts&) = delete;

    /** Goes on with the part in `folder`; both parts together get `bytes` at most. */
    Error open(const std::string& folder, size_t bytes);

    /**
     * After a failure, makes sure that there is a part with room for `bytes`, and takes a note of
     * `writeNote` back. If that fails, the note stays.
     */
    Error resume(size_t bytes);

    /** Leaves the file to the process that has forked this one. */
    void abandon();

    void close();

    /** Whether what was written is lost: the file was removed or cut. */
    bool isGone() const { return mIsGone; }

    const std::string& path() const { return mPath; }

    /** Whether `bytes` more would be too much for the part. An empty part takes everything. */
    bool isFullFor(size_t bytes) const { return mSize > 0 && mSize + bytes > mMaxSize; }

    /**
     * Why what was written is not there any more: the file was removed or cut, or the host has
     * closed its descriptor. The part is then closed.
     */
    Error findHarm();

    /** Begins a new part. An older part is deleted on a thread of its own: that takes its time. */
    Error startNext();

    /**
     * Adds whole lines. If that fails, none of them is there. `findHarm` comes first: the
     * descriptor may be the host's by now.
     */
    Error write(std::string_view lines);

    /** Adds a note after a failure: one line of up to 1 kB, which `resume` takes back. */
    void writeNote(std::string_view line);

    /** Adds a line without being the one that writes the record. */
    void writeBeside(std::string_view line) const;

private:
    Error openPart();
    void cutNote();
    Error cutTornLine();
    Error reserve(size_t bytes);
    bool append(std::string_view text) const;
    Error fail(const char* what, int reason = 0);

    std::string mPath;
    std::string mOldPath;
    size_t mMaxSize = 0;
    int mFd = -1;
    dev_t mDevice = 0;  // of the file, whose descriptor the host may close and use
    uint64_t mNumber = 0;
    size_t mSize = 0;  // bytes, without a note of `writeNote`
    size_t mNoteSize = 0;
    bool mIsGone = false;
    size_t mReserved = 0;  // bytes that the disk has room for
};

}  // namespace record
