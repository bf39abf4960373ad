#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string>
#include <string_view>
#include <type_traits>

#include "base/Calendar.h"

/**
 * Writing JSON, for the tools and for the recorder on the device, which may link no more than it
 * does: hence a header. Nothing here depends on the locale or takes a lock.
 */
namespace base {

namespace json {

inline constexpr char kHexDigits[] = "0123456789abcdef";
inline constexpr uint32_t kReplacement = 0xfffd;

inline bool isPlain(unsigned char c) {
    return c >= 0x20 && c < 0x80 && c != '"' && c != '\\';
}

/** Takes the first character, or the first byte of what is none, off `*text`. */
inline uint32_t takeCodePoint(std::string_view* text) {
    const auto byte = [&](size_t i) { return static_cast<unsigned char>((*text)[i]); };
    const unsigned char first = byte(0);
    const size_t size = first < 0x80 ? 1 : first < 0xe0 ? 2 : first < 0xf0 ? 3 : 4;
    constexpr uint32_t kSmallest[] = {0, 0, 0x80, 0x800, 0x10000};
    uint32_t value = size == 1 ? first : first & (0x7fU >> size);
    bool valid = size <= text->size() && (size == 1 || first >= 0xc0) && first < 0xf8;
    for (size_t i = 1; valid && i < size; ++i) {
        valid = (byte(i) & 0xc0) == 0x80;
        value = value << 6 | (byte(i) & 0x3f);
    }
    valid = valid && value >= kSmallest[size] && value <= 0x10ffff && (value & ~0x7ffU) != 0xd800;
    text->remove_prefix(valid ? size : 1);
    return valid ? value : kReplacement;
}

inline void appendUnit(std::string* out, uint32_t unit) {
    *out += "\\u";
    for (int shift = 12; shift >= 0; shift -= 4) *out += kHexDigits[unit >> shift & 0xf];
}

inline void appendCodePoint(std::string* out, uint32_t value) {
    constexpr char kNamed[] = "\b\f\n\r\t\"\\";
    constexpr char kNames[] = "bfnrt\"\\";
    if (const char* named = value < 0x80 && value != 0
                                    ? std::strchr(kNamed, static_cast<int>(value))
                                    : nullptr) {
        *out += '\\';
        *out += kNames[named - kNamed];
    } else if (value >= 0x20 && value < 0x80) {
        *out += static_cast<char>(value);
    } else if (value < 0x10000) {
        appendUnit(out, value);
    } else {
        appendUnit(out, 0xd800 + ((value - 0x10000) >> 10));
        appendUnit(out, 0xdc00 + (value & 0x3ff));
    }
}

inline void appendUtf8(std::string* out, uint32_t value) {
    if (value < 0x80) {
        *out += static_cast<char>(value);
        return;
    }
    const int more = value < 0x800 ? 1 : value < 0x10000 ? 2 : 3;
    constexpr unsigned kFirst[] = {0, 0xc0, 0xe0, 0xf0};
    *out += static_cast<char>(kFirst[more] | value >> 6 * more);
    for (int i = more - 1; i >= 0; --i) *out += static_cast<char>(0x80 | (value >> 6 * i & 0x3f));
}

/** The four hexadecimal digits that `text` begins with; U+FFFD if it does not. */
inline uint32_t parseUnit(std::string_view text) {
    uint32_t value = 0;
    for (size_t i = 0; i < 4; ++i) {
        const char digit = i < text.size() ? text[i] : '\0';
        const char* const found = digit != '\0' ? std::strchr(kHexDigits, digit | 0x20) : nullptr;
        if (found == nullptr) return kReplacement;
        value = value << 4 | static_cast<uint32_t>(found - kHexDigits);
    }
    return value;
}

constexpr double powerOfTen(int exponent) {
    double power = 1;
    for (; exponent > 0; --exponent) power *= 10;
    return power;
}

/** The decimal `digits` * 10^-`decimals`. */
struct Decimal {
    int64_t digits;
    int decimals;
};

/** `value`, positive and finite, to `count` significant digits or one more. */
inline Decimal toDecimal(double value, int count) {
    const int exponent = static_cast<int>(std::floor(std::log10(value)));
    const int decimals = count - 1 - exponent;
    const double scaled =
            decimals >= 0 ? value * powerOfTen(decimals) : value / powerOfTen(-decimals);
    return {std::llround(scaled), decimals};
}

inline double toDouble(Decimal decimal) {
    const auto digits = static_cast<double>(decimal.digits);
    return decimal.decimals >= 0 ? digits / powerOfTen(decimal.decimals)
                                 : digits * powerOfTen(-decimal.decimals);
}

/** Seven digits are what a person expects to see, nine always suffice. */
inline Decimal shortest(float value) {
    const Decimal decimal = toDecimal(value, 7);
    return static_cast<float>(toDouble(decimal)) == value ? decimal : toDecimal(value, 9);
}

inline void appendDecimal(std::string* out, Decimal decimal) {
    constexpr int kMostZeros = 6;
    for (; decimal.digits % 10 == 0; --decimal.decimals) decimal.digits /= 10;
    std::string digits = std::to_string(decimal.digits);
    const int whole =
            static_cast<int>(digits.size()) - decimal.decimals;  // digits before the point
    if (decimal.decimals <= 0 && -decimal.decimals <= kMostZeros) {
        digits.append(static_cast<size_t>(-decimal.decimals), '0');
    } else if (whole > 0 && decimal.decimals > 0) {
        digits.insert(static_cast<size_t>(whole), 1, '.');
    } else if (whole <= 0 && -whole <= kMostZeros) {
        digits.insert(0, "0." + std::string(static_cast<size_t>(-whole), '0'));
    } else {
        digits += 'e' + std::to_string(-decimal.decimals);
    }
    *out += digits;
}

}  // namespace json

/** Appends `text` as `appendText` writes it, without the quotes. */
inline void appendEscaped(std::string* out, std::string_view text) {
    size_t plain = 0;
    while (plain < text.size() && json::isPlain(static_cast<unsigned char>(text[plain]))) ++plain;
    out->append(text.substr(0, plain));
    text.remove_prefix(plain);
    while (!text.empty()) json::appendCodePoint(out, json::takeCodePoint(&text));
}

/** Appends `text` as a JSON string in ASCII. A byte that is not UTF-8 becomes U+FFFD. */
inline void appendText(std::string* out, std::string_view text) {
    *out += '"';
    appendEscaped(out, text);
    *out += '"';
}

/** The text whose JSON, without its quotes, is `json`: what `appendEscaped` takes, in UTF-8. */
inline std::string unescape(std::string_view json) {
    constexpr std::string_view kNames = "bfnrt";
    constexpr std::string_view kNamed = "\b\f\n\r\t";
    std::string text;
    for (size_t i = 0; i < json.size(); ++i) {
        if (json[i] != '\\' || i + 1 == json.size()) {
            text += json[i];
            continue;
        }
        const char kind = json[++i];
        if (kind != 'u') {
            const size_t named = kNames.find(kind);
            text += named == std::string_view::npos ? kind : kNamed[named];
            continue;
        }
        uint32_t value = json::parseUnit(json.substr(i + 1));
        i = std::min(i + 4, json.size());
        if (value >> 10 == 0x36 && json.substr(std::min(i + 1, json.size()), 2) == "\\u") {
            value = 0x10000 + ((value & 0x3ff) << 10) +
                    (json::parseUnit(json.substr(i + 3)) & 0x3ff);
            i += 6;
        }
        json::appendUtf8(&text, value);
    }
    return text;
}

inline void appendInteger(std::string* out, int64_t value) {
    *out += std::to_string(value);
}

/** Appends `ns` nanoseconds as milliseconds, with as many decimals as they need. */
inline void appendMs(std::string* out, int64_t ns) {
    if (ns < 0) {
        *out += '-';
        ns = -ns;
    }
    appendInteger(out, ns / kNsPerMs);
    int64_t rest = ns % kNsPerMs;
    if (rest == 0) return;
    *out += '.';
    for (int64_t unit = kNsPerMs / 10; rest > 0; rest %= unit, unit /= 10) {
        *out += static_cast<char>('0' + rest / unit);
    }
}

/**
 * Appends `value` with as few digits as give the same `float` again. JSON has no infinity, which is
 * written as a number that reads as one, and no NaN, which is written as 0.
 */
inline void appendFloat(std::string* out, float value) {
    if (std::isnan(value)) value = 0;
    if (std::signbit(value)) *out += '-';
    value = std::fabs(value);
    if (value == 0) {
        *out += '0';
    } else if (std::isinf(value)) {
        *out += "1e39";
    } else if (value < 1e9F && value == std::floor(value)) {
        appendInteger(out, static_cast<int64_t>(value));
    } else {
        json::appendDecimal(out, json::shortest(value));
    }
}

/** `text` as `appendText` writes it. */
inline std::string toJson(std::string_view text) {
    std::string json;
    appendText(&json, text);
    return json;
}

/** A name or a line of a file for a message: as JSON, the first 200 bytes of a longer one. */
inline std::string quote(std::string_view text) {
    constexpr size_t kMost = 200;
    if (text.size() <= kMost) return toJson(text);
    size_t end = kMost;
    while (end > 0 && (static_cast<unsigned char>(text[end]) & 0xC0U) == 0x80) --end;
    return toJson(text.substr(0, end)) + "...";
}

/** The time `ns` in milliseconds, as `appendMs` writes it. */
inline std::string formatMs(int64_t ns) {
    std::string text;
    appendMs(&text, ns);
    return text;
}

/** A time that JSON shows in milliseconds. */
struct Ms {
    int64_t ns;
};

/**
 * Appends JSON to a text, on one line: ", " between members and elements, ": " behind keys. The
 * caller keeps begins and ends in pairs.
 */
class JsonWriter {
public:
    explicit JsonWriter(std::string* out) : mOut(*out) {}

    JsonWriter& beginObject() { return open('{'); }
    JsonWriter& endObject() { return close('}'); }
    JsonWriter& beginArray() { return open('['); }
    JsonWriter& endArray() { return close(']'); }

    /** The name of the next value. */
    JsonWriter& key(std::string_view name) {
        separate();
        appendText(&mOut, name);
        mOut += ": ";
        mFollows = false;
        return *this;
    }

    template <typename T>
    JsonWriter& value(const T& value) {
        separate();
        if constexpr (std::is_same_v<T, bool>) {
            mOut += value ? "true" : "false";
        } else if constexpr (std::is_same_v<T, Ms>) {
            appendMs(&mOut, value.ns);
        } else if constexpr (std::is_same_v<T, float>) {
            appendFloat(&mOut, value);
        } else if constexpr (std::is_integral_v<T>) {
            static_assert(sizeof(T) < sizeof(int64_t) || std::is_signed_v<T>);
            appendInteger(&mOut, value);
        } else {
            appendText(&mOut, value);
        }
        mFollows = true;
        return *this;
    }

    /** A value, or members, that are JSON already. */
    JsonWriter& raw(std::string_view json) {
        separate();
        mOut += json;
        mFollows = true;
        return *this;
    }

    template <typename T>
    JsonWriter& member(std::string_view name, const T& value) {
        return key(name).value(value);
    }

private:
    JsonWriter& open(char bracket) {
        separate();
        mOut += bracket;
        mFollows = false;
        return *this;
    }

    JsonWriter& close(char bracket) {
        mOut += bracket;
        mFollows = true;
        return *this;
    }

    void separate() {
        if (mFollows) mOut += ", ";
    }

    std::string& mOut;
    bool mFollows = false;  // a value stands before, so that a comma comes between
};

}  // namespace base
