#include "report/Format.h"

#include <cstddef>
#include <cstdio>

#include "trace/TraceTime.h"

namespace report {

std::string formatClock(int64_t ns) {
    const auto ms = static_cast<long long>(ns / trace::kNsPerMs);
    char text[64];
    int length = std::snprintf(text, sizeof(text), "day %lld %02lld:%02lld:%02lld.%03lld",
                               ms / 86'400'000 + 1, ms / 3'600'000 % 24, ms / 60'000 % 60,
                               ms / 1000 % 60, ms % 1000);
    if (const auto rest = static_cast<int>(ns % trace::kNsPerMs)) {
        length += std::snprintf(text + length, sizeof(text) - length, "%06d", rest);
    }
    return std::string(text, length);
}

std::string printable(std::string_view text) {
    std::string result;
    for (const char c : text) {
        const bool blank = c == ' ' || c == '\t';
        const bool control = static_cast<unsigned char>(c) < ' ' || c == '\x7f';
        if (!blank || result.empty() || result.back() != ' ') {
            result += blank ? ' ' : control ? '?' : c;
        }
    }
    return result;
}

char levelLetter(int64_t level) {
    constexpr std::string_view kLetters = "??VDIWEFS";
    return level >= 0 && static_cast<size_t>(level) < kLetters.size() ? kLetters[level] : '?';
}

}  // namespace report
