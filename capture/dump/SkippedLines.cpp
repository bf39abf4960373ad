#include "capture/dump/SkippedLines.h"

#include "base/Json.h"

namespace capture {

namespace {

constexpr size_t kMostText = 200;  // bytes of a line that are shown

}  // namespace

void SkippedLines::add(std::string_view text, int64_t lineNumber) {
    if (count++ > 0) return;
    firstNumber = lineNumber;
    firstText = text.substr(0, kMostText);
}

std::string SkippedLines::naming(std::string_view what) const {
    return std::to_string(count) + ' ' + std::string(what) + ", the first is " +
           base::toJson(firstText);
}

}  // namespace capture
