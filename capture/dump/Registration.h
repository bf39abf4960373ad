#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace capture {

/** A line of the list of previous registrations. */
struct Registration {
    int64_t lineNumber = 0;
    int64_t timeOfDay = 0;  // milliseconds
    bool on = false;
    uint32_t handle = 0;
    std::string package;  // the client's tag
    std::optional<int32_t> uid;
    int64_t periodUs = 0;            // of an on
    std::optional<int64_t> batchUs;  // of an on; -1: as long as possible
    std::string refusal;             // why nothing came of it; empty if it took place
    size_t textHash = 0;             // equal lines of two dumps are the same registration

    bool tookPlace() const { return refusal.empty(); }
};

/** Reads a line of any platform version; nothing if it is no registration. */
std::optional<Registration> parseRegistration(std::string_view text, int64_t lineNumber);

/** Whether a line starts as a registration does: a time, readable or not, then "on" or "off". */
bool looksLikeRegistration(std::string_view text);

/** Whether both are the same line, read from two dumps of one device. */
bool isSameLine(const Registration& a, const Registration& b);

}  // namespace capture
