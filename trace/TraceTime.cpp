#include "trace/TraceTime.h"

namespace trace {

std::string formatMs(int64_t ns) {
    std::string text = std::to_string(ns / kNsPerMs);
    if (const int64_t rest = ns % kNsPerMs; rest != 0) {
        const std::string decimals = std::to_string(kNsPerMs + rest).substr(1);
        text += '.' + decimals.substr(0, decimals.find_last_not_of('0') + 1);
    }
    return text;
}

}  // namespace trace
