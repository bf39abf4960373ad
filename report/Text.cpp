#include "report/Text.h"

#include <algorithm>
#include <cstdio>

#include <unictype.h>
#include <unistr.h>
#include <uniwidth.h>

namespace report {

namespace {

constexpr std::string_view kEllipsis = "\u2026";

/** The first character of `text`, which is taken off it; U+FFFD for what is none. */
ucs4_t takeCharacter(std::string_view* text) {
    ucs4_t character = 0;
    const int size =
            u8_mbtouc(&character, reinterpret_cast<const uint8_t*>(text->data()), text->size());
    text->remove_prefix(static_cast<size_t>(size));
    return character;
}

void append(ucs4_t character, std::string* text) {
    uint8_t bytes[6];
    const int size = u8_uctomb(bytes, character, sizeof(bytes));
    text->append(reinterpret_cast<const char*>(bytes), static_cast<size_t>(size));
}

/** Whether a terminal would do something with it other than to show it. */
bool isControl(ucs4_t character) {
    return uc_is_general_category_withtable(
                   character, UC_CATEGORY_MASK_Cc | UC_CATEGORY_MASK_Zl | UC_CATEGORY_MASK_Zp) ||
           uc_is_property(character, UC_PROPERTY_BIDI_CONTROL);
}

size_t columnsOf(ucs4_t character) {
    const int columns = uc_width(character, "UTF-8");
    return columns > 0 ? static_cast<size_t>(columns) : 0;
}

}  // namespace

std::string safe(std::string_view text) {
    std::string result;
    while (!text.empty()) {
        const ucs4_t character = takeCharacter(&text);
        append(isControl(character) ? ucs4_t{'?'} : character, &result);
    }
    return result;
}

size_t width(std::string_view text) {
    size_t columns = 0;
    while (!text.empty()) columns += columnsOf(takeCharacter(&text));
    return columns;
}

std::string cut(const std::string& text, size_t columns) {
    const size_t all = width(text);
    if (all <= columns) return text;
    if (columns == 0) return {};
    const size_t kept = columns - 1;  // beside the ellipsis
    const size_t head = kept / 2;
    std::string result;
    std::string_view rest = text;
    size_t passed = 0;
    while (!rest.empty()) {
        std::string_view next = rest;
        const size_t end = passed + columnsOf(takeCharacter(&next));
        if (end > head) break;
        result.append(rest, 0, rest.size() - next.size());
        passed = end;
        rest = next;
    }
    result += kEllipsis;
    while (all - passed > kept - head) passed += columnsOf(takeCharacter(&rest));
    return result.append(rest);
}

std::vector<std::string> wrap(const std::string& text, size_t columns) {
    std::vector<std::string> lines;
    size_t room = 0;  // in the last line
    for (size_t start = 0; start <= text.size();) {
        const size_t end = std::min(text.find(' ', start), text.size());
        const std::string word = cut(text.substr(start, end - start), columns);
        const size_t needed = width(word);
        if (!lines.empty() && needed < room) {
            lines.back().append(" ").append(word);
            room -= needed + 1;
        } else {
            lines.push_back(word);
            room = columns - needed;
        }
        start = end + 1;
    }
    return lines;
}

std::string escape(std::string_view text) {
    std::string html;
    for (const char c : text) {
        switch (c) {
            case '&':
                html += "&amp;";
                break;
            case '<':
                html += "&lt;";
                break;
            case '>':
                html += "&gt;";
                break;
            case '"':
                html += "&quot;";
                break;
            case '\'':
                html += "&#39;";
                break;
            default:
                html += c;
        }
    }
    return html;
}

std::string formatHertz(double rate) {
    char text[48];
    std::snprintf(text, sizeof(text), rate < 1 ? "%.3g" : rate < 1e6 ? "%.1f" : "%.3g", rate);
    return text;
}

std::string formatRate(int64_t periodNs) {
    return periodNs <= 0 ? "fastest" : formatHertz(1e9 / static_cast<double>(periodNs));
}

}  // namespace report
