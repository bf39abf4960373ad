#pragma once

#include <charconv>
#include <cmath>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string_view>
#include <type_traits>

namespace capture {

// What the readers of a capture's lines share. Blanks are blanks, tabs and carriage returns.

constexpr bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

constexpr bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

bool endsWith(std::string_view text, std::string_view suffix);

/** Whether `text` is a number without a sign. */
bool areDigits(std::string_view text);

/** Without the blanks at both ends. */
std::string_view trimmed(std::string_view text);

/**
 * Without what editors, terminals and chats put around a line: a byte order mark and "> " in front,
 * blanks behind. Blanks in front stay, as a heading is one only at the start of its line.
 */
std::string_view unquoted(std::string_view line);

/** Takes `prefix` off `text`; false if `text` does not start with it. */
constexpr bool takePrefix(std::string_view* text, std::string_view prefix) {
    if (!startsWith(*text, prefix)) return false;
    text->remove_prefix(prefix.size());
    return true;
}

/** Takes what stands before the next blank off `text`, and the blanks around it. */
std::string_view takeWord(std::string_view* text);

/** Takes what stands before the next `separator` off `text`, and the separator; trims it. */
std::string_view takePart(std::string_view* text, char separator);

/** What stands behind `key` in `text`, up to the next of `ends` or the end of the line. */
std::optional<std::string_view> valueOf(std::string_view text, std::string_view key,
                                        std::initializer_list<std::string_view> ends = {});

/** The number at the start of `text`, after blanks; nothing if it is infinite or does not fit. */
template <typename Number>
std::optional<Number> parseNumber(std::string_view text, int base = 10) {
    text = trimmed(text);
    const char* const end = text.data() + text.size();
    Number number{};
    if constexpr (std::is_floating_point_v<Number>) {
        const auto error = std::from_chars(text.data(), end, number).ec;
        if (error != std::errc() || !std::isfinite(number)) return std::nullopt;
    } else if (std::from_chars(text.data(), end, number, base).ec != std::errc()) {
        return std::nullopt;
    }
    return number;
}

/** Whether `text` may be a name: a trace takes no text with a NUL, and a device prints none. */
bool isName(std::string_view text);

/** A sensor's handle, which is printed with 0x in front unless it is 0. */
std::optional<uint32_t> parseHandle(std::string_view text);

/**
 * Reads the start of `text` by `pattern`, in which each run of '#' stands for as many digits of one
 * field and everything else for itself. False if `text` does not start so.
 */
bool readFields(std::string_view text, std::string_view pattern, int* fields);

}  // namespace capture
