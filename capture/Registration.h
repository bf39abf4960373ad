#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace capture {

/** A line of the list of previous registrations. */
struct Registration {
    int64_t lineNumber;
    int64_t timeOfDay;  // milliseconds
    bool on;
    uint32_t handle;
    std::string package;
    std::optional<int> uid;
    int64_t periodUs = 0;
    size_t textHash = 0;  // equal lines of two dumps are the same registration
};

/** Reads a line of any platform version; nothing if it is no registration. */
std::optional<Registration> parseRegistration(std::string_view text, int64_t lineNumber);

/** Whether a line starts as a registration does: a time of day, then "on" or "off". */
bool looksLikeRegistration(std::string_view text);

/** Whether both are the same line, read from two dumps of one device. */
bool isSameLine(const Registration& a, const Registration& b);

}  // namespace capture
