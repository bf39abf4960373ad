#include "report/Format.h"

#include <cstddef>
#include <cstdio>

#include "base/Calendar.h"

namespace report {

std::string formatDuration(int64_t ns) {
    return base::formatDuration(std::chrono::nanoseconds(ns));
}

std::string formatTimeOfDay(int64_t ns) {
    return base::formatTimeOfDay(std::chrono::nanoseconds(ns));
}

std::string formatClock(int64_t ns) {
    const std::string day = "day " + std::to_string(ns / base::kNsPerDay + 1) + ' ';
    char decimals[16];
    if (ns % base::kNsPerMs == 0) {
        std::snprintf(decimals, sizeof(decimals), ".%03d",
                      static_cast<int>(ns % base::kNsPerSecond / base::kNsPerMs));
    } else {
        std::snprintf(decimals, sizeof(decimals), ".%09d",
                      static_cast<int>(ns % base::kNsPerSecond));
    }
    return day + base::formatTimeOfDay(std::chrono::nanoseconds(ns)) + decimals;
}

std::string onOneLine(std::string_view text) {
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

std::string join(const std::vector<std::string>& texts, std::string_view between) {
    std::string joined;
    for (const std::string& text : texts) {
        if (&text != texts.data()) joined += between;
        joined += text;
    }
    return joined;
}

char levelLetter(int64_t level) {
    constexpr std::string_view kLetters = "??VDIWEFS";
    return level >= 0 && static_cast<size_t>(level) < kLetters.size() ? kLetters[level] : '?';
}

}  // namespace report
