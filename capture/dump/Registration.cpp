#include "capture/dump/Registration.h"

#include <algorithm>
#include <functional>

#include "capture/dump/WallTime.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr int64_t kMaxPeriodUs = 9'000'000'000'000'000;  // fits 64 bits in nanoseconds

struct Action {
    bool on;
    bool isWord;  // "activated", as versions up to 7.1 write it, and not "+"
};

/** Taken off `text`. */
std::optional<Action> takeAction(std::string_view* text) {
    const std::string_view word = takeWord(text);
    if (word == "+" || word == "-") return Action{word == "+", false};
    if (word == "activated" || word == "de-activated") return Action{word == "activated", true};
    return std::nullopt;
}

/** The number behind `key`, or behind `olderKey` if `text` does not hold `key`. */
std::optional<int64_t> parsePeriod(std::string_view text, std::string_view key,
                                   std::string_view olderKey) {
    auto period = valueOf(text, key);
    if (!period) period = valueOf(text, olderKey);
    const auto number = parseNumber<int64_t>(period.value_or(""));
    const bool fits = number && *number >= -kMaxPeriodUs && *number <= kMaxPeriodUs;
    return fits ? number : std::nullopt;
}

/** The form of late 15 and newer, "... result=OK (sensor, package): (NAME, PACKAGE)". */
struct ResultForm {
    std::string_view result;
    std::string_view package;
};

/** In older forms the package stands first. Such a line has no result, even if its names hold one.
 */
std::optional<ResultForm> parseResult(std::string_view text) {
    const size_t begin = text.find(" result=");
    if (begin == std::string_view::npos || text.find(" package=") < begin) return std::nullopt;
    constexpr std::string_view kPair = " (sensor, package): (";
    const auto pair = valueOf(text, kPair);
    const size_t comma = pair ? pair->rfind(", ") : std::string_view::npos;
    if (comma == std::string_view::npos || !endsWith(*pair, ")")) return std::nullopt;
    return ResultForm{*valueOf(text.substr(begin), "result=", {kPair}),
                      trimmed(pair->substr(comma + 2, pair->size() - comma - 3))};
}

/** Nothing came of an on with any other result; an off took place but for this one. */
bool isRefused(bool on, std::string_view result) {
    return on ? result != "OK" : result == "BAD_VALUE";
}

bool isOdd(char c) {
    return (c < '0' || c > '9') && c != ':' && c != '.';
}

}  // namespace

std::optional<Registration> parseRegistration(std::string_view text, int64_t lineNumber) {
    const auto timeOfDay = parseTimeOfDay(text);
    if (!timeOfDay) return std::nullopt;
    Registration registration;
    registration.lineNumber = lineNumber;
    registration.timeOfDay = *timeOfDay;
    registration.textHash = std::hash<std::string_view>()(text);
    takeWord(&text);
    const auto action = takeAction(&text);
    if (!action) return std::nullopt;
    registration.on = action->on;

    const auto result = action->isWord ? std::nullopt : parseResult(text);
    const auto package =
            result ? result->package
                   : valueOf(text, "package=", {" handle=", " samplingPeriod=", " samplingRate="});
    const auto handle = parseHandle(action->isWord ? valueOf(text, "handle=").value_or("") : text);
    if (!handle || !package || !isName(*package)) return std::nullopt;
    registration.handle = *handle;
    registration.package = *package;

    const std::string_view ids = text.substr(0, std::min(text.find("package="), text.find('(')));
    if (const auto uid = action->isWord ? std::nullopt : valueOf(ids, "uid=")) {
        registration.uid = parseNumber<int32_t>(*uid);
        if (!registration.uid) return std::nullopt;
    }
    if (result && isRefused(action->on, result->result)) {
        registration.refusal = result->result.empty() ? "?" : result->result;
        return registration;
    }
    if (!action->on) return registration;
    const auto period = parsePeriod(text, "samplingPeriod=", "samplingRate=");
    if (!period) return std::nullopt;
    registration.periodUs = *period;
    registration.batchUs = parsePeriod(text, "batchingPeriod=", "maxReportLatency=");
    return registration;
}

bool looksLikeRegistration(std::string_view text) {
    const std::string_view time = takeWord(&text);
    if (time.empty() || time[0] < '0' || time[0] > '9' ||
        std::count(time.begin(), time.end(), ':') != 2 ||
        std::any_of(time.begin(), time.end(), isOdd)) {
        return false;
    }
    return startsWith(text, "+") || startsWith(text, "-") || startsWith(text, "activated") ||
           startsWith(text, "de-activated");
}

bool isSameLine(const Registration& a, const Registration& b) {
    return a.textHash == b.textHash && a.timeOfDay == b.timeOfDay && a.on == b.on &&
           a.handle == b.handle && a.package == b.package;
}

}  // namespace capture
