#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace replay {

/**
 * Shows on standard error how far a long replay has come: one line that is written over, only on a
 * terminal, and only from two seconds on. It is gone when the replay is over.
 */
class Progress {
public:
    /** `isWanted`: not where lines on the same terminal show it already. */
    Progress(size_t files, bool isWanted);
    ~Progress() { clear(); }

    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    /** `done` files are over, and `line` of the next one, `name`, has been played. */
    void show(size_t done, const std::string& name, int64_t line);

    /** Takes the line away, as something else is about to be written. */
    void clear();

private:
    const size_t mFiles;
    const bool mIsWanted;
    const int64_t mStarted;  // ns of real time
    int64_t mShown = 0;      // when, likewise; 0: no line is there
};

}  // namespace replay
