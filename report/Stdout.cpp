#include "report/Stdout.h"

#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <cstring>

#include <unistd.h>

#include "base/FileIo.h"
#include "base/Result.h"

namespace report {

namespace {

constexpr size_t kFlushBytes = size_t{64} << 10;

}  // namespace

void Stdout::write(std::string_view text) {
    mGathered += text;
    if (mGathered.size() >= kFlushBytes) flush();
}

void Stdout::flush() {
    if (!base::writeAll(STDOUT_FILENO, mGathered.data(), mGathered.size())) {
        std::fprintf(stderr, "cannot write standard output: %s\n", std::strerror(errno));
        _exit(base::kStatusFailed);
    }
    mGathered.clear();
}

}  // namespace report
