#include "replay/Progress.h"

#include <cstdio>

#include <time.h>
#include <unistd.h>

#include "report/Text.h"

namespace replay {

namespace {

constexpr int64_t kFirstAfterNs = 2'000'000'000;
constexpr int64_t kIntervalNs = 200'000'000;

/** The monotonic clock is virtual; this one is not. */
int64_t realTime() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC_RAW, &now);
    return int64_t{now.tv_sec} * 1'000'000'000 + now.tv_nsec;
}

}  // namespace

Progress::Progress(size_t files, bool isWanted)
      : mFiles(files),
        mIsWanted(isWanted && isatty(STDERR_FILENO) != 0),
        mStarted(realTime()) {}

void Progress::show(size_t done, const std::string& name, int64_t line) {
    if (!mIsWanted) return;
    const int64_t now = realTime();
    if (now - mStarted < kFirstAfterNs || now - mShown < kIntervalNs) return;
    mShown = now;
    std::string text = std::to_string(done) + " of " + std::to_string(mFiles) + " files";
    if (line > 0) text += ", line " + std::to_string(line) + " of " + report::safe(name);
    std::fprintf(stderr, "\r%s\x1b[K", report::cut(text, 79).c_str());
}

void Progress::clear() {
    if (mShown == 0) return;
    mShown = 0;
    std::fputs("\r\x1b[K", stderr);
}

}  // namespace replay
