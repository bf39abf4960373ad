#include "replay/Progress.h"

#include <cstdio>

#include <unistd.h>

#include "replay/RealTime.h"
#include "report/Text.h"

namespace replay {

namespace {

constexpr int64_t kFirstAfterNs = 2'000'000'000;
constexpr int64_t kIntervalNs = 200'000'000;

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
