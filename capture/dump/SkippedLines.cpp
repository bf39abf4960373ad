#include "capture/dump/SkippedLines.h"

#include "base/Json.h"

namespace capture {

void SkippedLines::add(std::string_view text, int64_t lineNumber) {
    if (count++ > 0) return;
    firstNumber = lineNumber;
    firstQuoted = base::quote(text);
}

std::string SkippedLines::naming(std::string_view what) const {
    return std::to_string(count) + ' ' + std::string(what) + ", the first is " + firstQuoted;
}

}  // namespace capture
