#include "trace/JsonReader.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <unordered_set>

#include "base/Json.h"

namespace trace {

using simdjson::dom::array;
using simdjson::dom::element;
using simdjson::dom::object;

namespace {

constexpr std::string_view kDigits = "0123456789";
constexpr size_t kFewKeys = 8;  // are compared with each other faster than they are hashed

/** Takes the characters of `set` off the front of `text`; whether there were any. */
bool take(std::string_view* text, std::string_view set) {
    const size_t count = std::min(text->find_first_not_of(set), text->size());
    text->remove_prefix(count);
    return count > 0;
}

/** Whether `token` is a number by JSON's grammar, however large. */
bool isNumber(std::string_view token) {
    if (token.substr(0, 1) == "-") token.remove_prefix(1);
    if (token.size() > 1 && token[0] == '0' && kDigits.find(token[1]) != kDigits.npos) return false;
    if (!take(&token, kDigits)) return false;
    if (token.substr(0, 1) == ".") {
        token.remove_prefix(1);
        if (!take(&token, kDigits)) return false;
    }
    if (token.empty()) return true;
    if (token[0] != 'e' && token[0] != 'E') return false;
    token.remove_prefix(1);
    if (token.substr(0, 1) == "-" || token.substr(0, 1) == "+") token.remove_prefix(1);
    return take(&token, kDigits) && token.empty();
}

/** Whether a number is too large for 64 bits: its integer, or the exponent of its double. */
bool isTooLarge(std::string_view token) {
    double real = 0;
    if (token.find_first_of(".eE") != token.npos) {
        return std::from_chars(token.begin(), token.end(), real).ec != std::errc();
    }
    int64_t integer = 0;
    uint64_t natural = 0;
    return std::from_chars(token.begin(), token.end(), integer).ec != std::errc() &&
           std::from_chars(token.begin(), token.end(), natural).ec != std::errc();
}

/** The first number outside of strings that is too large; empty if there is a bad one before. */
std::string_view findTooLarge(std::string_view text) {
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '"') {
            for (++i; i < text.size() && text[i] != '"'; ++i) {
                if (text[i] == '\\') ++i;
            }
        } else if (text[i] == '-' || kDigits.find(text[i]) != kDigits.npos) {
            const size_t end = text.find_first_not_of("+-.0123456789eE", i);
            const std::string_view token = text.substr(i, end - i);
            if (!isNumber(token)) return {};
            if (isTooLarge(token)) return token;
            i += token.size() - 1;
        }
    }
    return {};
}

}  // namespace

std::string explain(simdjson::error_code status, std::string_view text) {
    constexpr size_t kShown = 40;
    if (status == simdjson::NUMBER_ERROR) {
        if (const std::string_view token = findTooLarge(text); !token.empty()) {
            return "the number " + std::string(token.substr(0, kShown)) +
                   (token.size() > kShown ? "..." : "") + " is out of range";
        }
    }
    return std::string("not valid JSON: ") + simdjson::error_message(status);
}

Error read(element json, bool* value) {
    return json.get(*value) == simdjson::SUCCESS ? Error() : "must be true or false";
}

Error read(element json, int64_t* value) {
    return json.get(*value) == simdjson::SUCCESS ? Error() : "must be an integer of 64 bits";
}

Error read(element json, int32_t* value) {
    int64_t wide = 0;
    if (json.get(wide) != simdjson::SUCCESS || wide != static_cast<int32_t>(wide)) {
        return "must be an integer of 32 bits";
    }
    *value = static_cast<int32_t>(wide);
    return {};
}

Error read(element json, std::string* value) {
    std::string_view text;
    if (json.get(text) != simdjson::SUCCESS) return "must be a text";
    if (text.find('\0') != std::string_view::npos) return "must be a text without NUL";
    value->assign(text);
    return {};
}

Error read(element json, std::vector<int32_t>* value) {
    array list;
    if (json.get(list) != simdjson::SUCCESS) return "must be an array of integers";
    for (const element item : list) {
        if (Error error = read(item, &value->emplace_back())) return "each element " + *error;
    }
    return {};
}

Error checkKeys(object json) {
    const auto twice = [](std::string_view key) {
        return "the key " + base::quote(key) + " twice";
    };
    if (json.size() > kFewKeys) {
        std::unordered_set<std::string_view> keys;
        for (const auto field : json) {
            if (!keys.insert(field.key).second) return twice(field.key);
        }
        return {};
    }
    std::array<std::string_view, kFewKeys> keys;
    auto end = keys.begin();
    for (const auto field : json) {
        if (std::find(keys.begin(), end, field.key) != end) return twice(field.key);
        *end++ = field.key;
    }
    return {};
}

}  // namespace trace
