#include "capture/Registration.h"

#include <functional>

#include "capture/CaptureText.h"
#include "capture/WallTime.h"

namespace capture {

namespace {

constexpr int64_t kMaxPeriodUs = 9'000'000'000'000'000;  // fits 64 bits in nanoseconds
constexpr size_t kTimeOfDaySize = 9;                     // with the blank behind it

/** Takes `word` and the blank behind it off `text`. */
bool takeExactly(std::string_view* text, std::string_view word) {
    if (!startsWith(*text, word) || text->substr(word.size(), 1) != " ") return false;
    *text = trimmed(text->substr(word.size()));
    return true;
}

/** "on" or "off", taken off `text`. */
std::optional<bool> takeAction(std::string_view* text) {
    if (takeExactly(text, "+") || takeExactly(text, "activated")) return true;
    if (takeExactly(text, "-") || takeExactly(text, "de-activated")) return false;
    return std::nullopt;
}

/** "... result=OK (sensor, package): (NAME, PACKAGE)"; the name may hold commas. */
std::optional<std::string_view> packageOfPair(std::string_view text) {
    const auto pair = valueOf(text, "result=OK (sensor, package): (");
    const size_t comma = pair ? pair->rfind(", ") : std::string_view::npos;
    if (comma == std::string_view::npos || !endsWith(*pair, ")")) return std::nullopt;
    return trimmed(pair->substr(comma + 2, pair->size() - comma - 3));
}

/** A trace takes no text with a NUL, and a device prints none. */
bool isName(std::string_view text) {
    return !text.empty() && text.find('\0') == std::string_view::npos;
}

std::optional<int64_t> parsePeriod(std::string_view text) {
    auto period = valueOf(text, "samplingPeriod=");
    if (!period) period = valueOf(text, "samplingRate=");
    const auto number = parseNumber<int64_t>(period.value_or(""));
    const bool fits = number && *number >= -kMaxPeriodUs && *number <= kMaxPeriodUs;
    return fits ? number : std::nullopt;
}

}  // namespace

std::optional<Registration> parseRegistration(std::string_view text, int64_t lineNumber) {
    const auto timeOfDay = parseTimeOfDay(text);
    if (!timeOfDay) return std::nullopt;
    const size_t textHash = std::hash<std::string_view>()(text);
    text = trimmed(text.substr(kTimeOfDaySize));
    const bool byName = startsWith(text, "activated ") || startsWith(text, "de-activated ");
    const auto on = takeAction(&text);
    if (!on) return std::nullopt;

    const auto handle = parseHandle(byName ? valueOf(text, "handle=").value_or("") : text);
    auto package = valueOf(text, "package=", {" handle=", " samplingPeriod=", " samplingRate="});
    if (!package) package = packageOfPair(text);
    const auto period = *on ? parsePeriod(text) : 0;
    if (!handle || !package || !isName(*package) || !period) return std::nullopt;

    Registration registration{lineNumber, *timeOfDay, *on,     *handle, std::string(*package),
                              {},         *period,    textHash};
    if (const auto uid = valueOf(text, "uid=")) registration.uid = parseNumber<int>(*uid);
    return registration;
}

bool looksLikeRegistration(std::string_view text) {
    if (!parseTimeOfDay(text)) return false;
    text = trimmed(text.substr(kTimeOfDaySize));
    return startsWith(text, "+") || startsWith(text, "-") || startsWith(text, "activated") ||
           startsWith(text, "de-activated");
}

bool isSameLine(const Registration& a, const Registration& b) {
    return a.textHash == b.textHash && a.timeOfDay == b.timeOfDay && a.on == b.on &&
           a.handle == b.handle && a.package == b.package;
}

}  // namespace capture
