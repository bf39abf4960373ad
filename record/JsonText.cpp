#include "record/JsonText.h"

#include <cmath>
#include <cstring>
#include <limits>

namespace record {

namespace {

constexpr char kHexDigits[] = "0123456789abcdef";
constexpr uint32_t kReplacement = 0xfffd;

bool isPlain(unsigned char c) {
    return c >= 0x20 && c < 0x80 && c != '"' && c != '\\';
}

/** Takes the first character, or the first byte of what is none, off `*text`. */
uint32_t takeCodePoint(std::string_view* text) {
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

void appendUnit(std::string* out, uint32_t unit) {
    *out += "\\u";
    for (int shift = 12; shift >= 0; shift -= 4) *out += kHexDigits[unit >> shift & 0xf];
}

void appendCodePoint(std::string* out, uint32_t value) {
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
Decimal toDecimal(double value, int count) {
    const int exponent = static_cast<int>(std::floor(std::log10(value)));
    const int decimals = count - 1 - exponent;
    const double scaled =
            decimals >= 0 ? value * powerOfTen(decimals) : value / powerOfTen(-decimals);
    return {std::llround(scaled), decimals};
}

double toDouble(Decimal decimal) {
    const auto digits = static_cast<double>(decimal.digits);
    return decimal.decimals >= 0 ? digits / powerOfTen(decimal.decimals)
                                 : digits * powerOfTen(-decimal.decimals);
}

/** Seven digits are what a person expects to see, nine always suffice. */
Decimal shortest(float value) {
    const Decimal decimal = toDecimal(value, 7);
    return static_cast<float>(toDouble(decimal)) == value ? decimal : toDecimal(value, 9);
}

void appendDecimal(std::string* out, Decimal decimal) {
    constexpr int kMostZeros = 6;
    for (; decimal.digits % 10 == 0; --decimal.decimals) decimal.digits /= 10;
    std::string digits = std::to_string(decimal.digits);
    const int whole =
            static_cast<int>(digits.size()) - decimal.decimals;  // digits before the point
    if (decimal.decimals <= 0 && -decimal.decimals <= kMostZeros) {
        digits.append(static_cast<size_t>(-decimal.decimals), '0');
    } else if (whole > 0 && decimal.decimals > 0) {
        digits.insert(static_cast<size_t>(whole), ".");
    } else if (whole <= 0 && -whole <= kMostZeros) {
        digits.insert(0, "0." + std::string(static_cast<size_t>(-whole), '0'));
    } else {
        digits += 'e' + std::to_string(-decimal.decimals);
    }
    *out += digits;
}

}  // namespace

void appendText(std::string* out, std::string_view text) {
    *out += '"';
    appendEscaped(out, text);
    *out += '"';
}

void appendEscaped(std::string* out, std::string_view text) {
    size_t plain = 0;
    while (plain < text.size() && isPlain(static_cast<unsigned char>(text[plain]))) ++plain;
    out->append(text.substr(0, plain));
    text.remove_prefix(plain);
    while (!text.empty()) appendCodePoint(out, takeCodePoint(&text));
}

void appendInteger(std::string* out, int64_t value) {
    *out += std::to_string(value);
}

void appendMs(std::string* out, int64_t ns) {
    constexpr int64_t kNsPerMs = 1'000'000;
    appendInteger(out, ns / kNsPerMs);
    int64_t rest = ns % kNsPerMs;
    if (rest == 0) return;
    *out += '.';
    for (int64_t unit = kNsPerMs / 10; rest > 0; rest %= unit, unit /= 10) {
        *out += static_cast<char>('0' + rest / unit);
    }
}

void appendFloat(std::string* out, float value) {
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
        appendDecimal(out, shortest(value));
    }
}

}  // namespace record
