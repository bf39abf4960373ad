#include "report/Stdout.h"

#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <cstring>

#include <unistd.h>

#include "trace/Failure.h"
#include "trace/FileIo.h"

namespace report {

namespace {

constexpr size_t kFlushSize = size_t{64} << 10;

}  // namespace

void Stdout::write(std::string_view text) {
    mGathered += text;
    if (mGathered.size() >= kFlushSize) flush();
}

void Stdout::flush() {
    if (!trace::writeAll(STDOUT_FILENO, mGathered.data(), mGathered.size())) {
        std::fprintf(stderr, "cannot write standard output: %s\n", std::strerror(errno));
        _exit(trace::kStatusFailed);
    }
    mGathered.clear();
}

}  // namespace report
