#include "capture/dump/HistoryLine.h"

#include <algorithm>
#include <string>

#include "capture/dump/WallTime.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

using Kind = HistoryLine::Kind;

bool areHexDigits(std::string_view text) {
    constexpr std::string_view kHexDigits = "0123456789abcdefABCDEF";
    return text.find_first_not_of(kHexDigits) == std::string_view::npos;
}

/** "18" and the unit behind it, taken off `text` and added to `duration`. */
bool takeUnit(std::string_view* text, std::string_view unit, int64_t factor, int64_t* duration) {
    constexpr size_t kMostDigits = 9;
    const auto end = std::find_if_not(text->begin(), text->end(), isDigit);
    const auto digits = static_cast<size_t>(end - text->begin());
    if (digits == 0 || digits > kMostDigits) return false;
    std::string_view rest = text->substr(digits);
    if (!takePrefix(&rest, unit)) return false;
    if (unit == "m" && startsWith(rest, "s")) return false;  // milliseconds
    *duration += *parseNumber<int64_t>(text->substr(0, digits)) * factor;
    *text = rest;
    return true;
}

/** "0", or "+1d02h03m04s567ms" with leading units left out. */
std::optional<int64_t> parseDuration(std::string_view text) {
    if (text == "0") return 0;
    const bool isNegative = startsWith(text, "-");
    if (!isNegative && !startsWith(text, "+")) return std::nullopt;
    text.remove_prefix(1);
    if (text.empty()) return std::nullopt;
    int64_t duration = 0;
    takeUnit(&text, "d", kMsPerDay, &duration);
    takeUnit(&text, "h", kMsPerHour, &duration);
    takeUnit(&text, "m", kMsPerMinute, &duration);
    takeUnit(&text, "s", kMsPerSecond, &duration);
    takeUnit(&text, "ms", 1, &duration);
    if (!text.empty()) return std::nullopt;
    return isNegative ? -duration : duration;
}

/** When the line was written, taken off `text`. */
std::optional<int64_t> takeTime(std::string_view* text, HistoryFormat format) {
    if (format == HistoryFormat::kLocalTime) {
        const auto time = parseYearlessStamp(*text);
        if (time) *text = text->substr(kYearlessStampSize);
        return time;
    }
    const auto duration = parseDuration(takeWord(text));
    const std::string_view number = takeWord(text);  // "(16)"
    const bool isNumber = startsWith(number, "(") && endsWith(number, ")") &&
                          areDigits(number.substr(1, number.size() - 2));
    return isNumber ? duration : std::nullopt;
}

std::optional<int> plugValue(std::string_view kind) {
    if (kind == "none") return kUnplugged;
    if (kind == "ac") return kPluggedAc;
    if (kind == "usb") return kPluggedUsb;
    const bool isOther = kind == "wireless" || kind == "dock" || areDigits(kind);
    return isOther ? std::optional(kPluggedOther) : std::nullopt;
}

/** What the flag "+NAME" or "-NAME" says of a state. */
void readFlag(std::string_view item, HistoryLine* line) {
    const bool on = item[0] == '+';
    const auto set = [&](State state, int value) {
        line->values[static_cast<size_t>(state)] = value;
    };
    item.remove_prefix(1);
    if (item == "screen") set(State::kDisplay, on ? kDisplayOn : kDisplayOff);
    if (item == "camera") set(State::kCamera, on ? 1 : 0);
    if (item == "phone_in_call") set(State::kCall, on ? 1 : 0);
}

void readItem(std::string_view item, HistoryLine* line) {
    if (item[0] == '+' || item[0] == '-') {
        readFlag(item, line);
    } else if (takePrefix(&item, "status=")) {
        line->full = item == "full" || item == "unknown";
    } else if (takePrefix(&item, "plug=")) {
        if (const auto value = plugValue(item)) {
            line->values[static_cast<size_t>(State::kCharge)] = value;
        }
    }
}

/** Without what stands in double quotes: names of apps, which may hold anything. */
std::string withoutQuoted(std::string_view text) {
    std::string rest;
    for (;;) {
        const size_t begin = text.find('"');
        const size_t end = begin == std::string_view::npos ? begin : text.find('"', begin + 1);
        if (end == std::string_view::npos) return rest.append(text);
        rest.append(text.substr(0, begin));
        text.remove_prefix(end + 1);
    }
}

/** "085 80180000 ITEM ...": the battery's level, flags that a bug report adds, and the items. */
bool readRecord(std::string_view text, HistoryLine* line) {
    const std::string_view level = takeWord(&text);
    if (level.size() != 3 || !areDigits(level)) return false;
    const std::string unquotedItems = withoutQuoted(text);
    std::string_view items = unquotedItems;
    std::string_view item = takeWord(&items);
    if (item.size() == 8 && areHexDigits(item)) item = takeWord(&items);
    for (; !item.empty(); item = takeWord(&items)) readItem(item, line);
    return true;
}

std::optional<Kind> parseCommand(std::string_view text) {
    if (text == "START") return Kind::kStart;
    if (text == "SHUTDOWN") return Kind::kShutdown;
    if (text == "*OVERFLOW*") return Kind::kOverflow;
    return std::nullopt;
}

/** "TIME: 2018-04-25-11-42-15", or the same of a reset. */
bool readTime(std::string_view text, HistoryLine* line) {
    line->kind = takePrefix(&text, "RESET:") ? Kind::kReset : Kind::kTime;
    const auto stamp = takePrefix(&text, "TIME:") ? parseDashedStamp(trimmed(text)) : std::nullopt;
    line->stamp = stamp.value_or(0);
    return stamp.has_value();
}

}  // namespace

std::optional<HistoryLine> parseHistoryLine(std::string_view text, HistoryFormat format) {
    const auto prefix = takeTime(&text, format);
    if (!prefix) return std::nullopt;
    text = trimmed(text);
    HistoryLine line{*prefix, Kind::kRecord};
    if (const auto command = parseCommand(text)) {
        line.kind = *command;
    } else if (!readRecord(text, &line) && !readTime(text, &line)) {
        return std::nullopt;
    }
    return line;
}

}  // namespace capture
