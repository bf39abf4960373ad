#pragma once

#include <charconv>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string_view>

namespace capture {

// What the readers of a capture's lines share. Blanks are blanks, tabs and carriage returns.

bool startsWith(std::string_view text, std::string_view prefix);
bool endsWith(std::string_view text, std::string_view suffix);

/** Without the blanks at both ends. */
std::string_view trimmed(std::string_view text);

/**
 * Without what editors, terminals and chats put around a line: a byte order mark and "> " in front,
 * blanks behind. Blanks in front stay, as a heading is one only at the start of its line.
 */
std::string_view unquoted(std::string_view line);

/** Takes `prefix` off `text`; false if `text` does not start with it. */
bool takePrefix(std::string_view* text, std::string_view prefix);

/** Takes what stands before the next blank off `text`, and the blanks around it. */
std::string_view takeWord(std::string_view* text);

/** What stands behind `key` in `text`, up to the next of `ends` or the end of the line. */
std::optional<std::string_view> valueOf(std::string_view text, std::string_view key,
                                        std::initializer_list<std::string_view> ends = {});

/** The number at the start of `text`, after blanks. */
template <typename Number>
std::optional<Number> parseNumber(std::string_view text, int base = 10) {
    text = trimmed(text);
    Number number{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    return error == std::errc() ? std::optional(number) : std::nullopt;
}

/** A sensor's handle, which is printed with 0x in front unless it is 0. */
std::optional<uint32_t> parseHandle(std::string_view text);

/**
 * Reads the start of `text` by `pattern`, in which each run of '#' stands for as many digits of one
 * field and everything else for itself. False if `text` does not start so.
 */
bool readFields(std::string_view text, std::string_view pattern, int* fields);

}  // namespace capture
