#include "capture/text/CaptureText.h"

#include <algorithm>

#include "base/LineReader.h"

namespace capture {

namespace {

constexpr std::string_view kBlanks = " \t\r";

}  // namespace

bool endsWith(std::string_view text, std::string_view suffix) {
    return text.size() >= suffix.size() && text.substr(text.size() - suffix.size()) == suffix;
}

bool areDigits(std::string_view text) {
    return !text.empty() && std::all_of(text.begin(), text.end(), isDigit);
}

std::string_view trimmed(std::string_view text) {
    const size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos) return {};
    return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

std::string_view unquoted(std::string_view line) {
    line = base::withoutMark(line);
    for (;;) {
        const size_t begin = line.find_first_not_of(kBlanks);
        if (begin == std::string_view::npos) return {};
        if (line[begin] != '>') break;
        line.remove_prefix(begin + 1);
        takePrefix(&line, " ");
    }
    return line.substr(0, line.find_last_not_of(kBlanks) + 1);
}

std::string_view takeWord(std::string_view* text) {
    *text = trimmed(*text);
    const std::string_view word = text->substr(0, text->find_first_of(kBlanks));
    *text = trimmed(text->substr(word.size()));
    return word;
}

std::string_view takePart(std::string_view* text, char separator) {
    const size_t end = text->find(separator);
    const std::string_view part = trimmed(text->substr(0, end));
    text->remove_prefix(end == std::string_view::npos ? text->size() : end + 1);
    return part;
}

std::optional<std::string_view> valueOf(std::string_view text, std::string_view key,
                                        std::initializer_list<std::string_view> ends) {
    const size_t found = text.find(key);
    if (found == std::string_view::npos) return std::nullopt;
    std::string_view value = text.substr(found + key.size());
    for (const std::string_view end : ends) value = value.substr(0, value.find(end));
    return trimmed(value);
}

bool isName(std::string_view text) {
    return !text.empty() && text.find('\0') == std::string_view::npos;
}

std::optional<uint32_t> parseHandle(std::string_view text) {
    text = trimmed(text);
    takePrefix(&text, "0x");
    return parseNumber<uint32_t>(text, 16);
}

bool readFields(std::string_view text, std::string_view pattern, int* fields) {
    if (text.size() < pattern.size()) return false;
    int number = 0;
    for (size_t i = 0; i < pattern.size(); ++i) {
        if (pattern[i] != '#') {
            if (text[i] != pattern[i]) return false;
            continue;
        }
        if (!isDigit(text[i])) return false;
        number = number * 10 + (text[i] - '0');
        if (i + 1 < pattern.size() && pattern[i + 1] == '#') continue;
        *fields++ = number;
        number = 0;
    }
    return true;
}

}  // namespace capture
