#include "capture/dump/EventLog.h"

#include <algorithm>
#include <utility>

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

/** What stands behind a stamp: "[UID] PID TID LEVEL TAG : VALUE". */
struct Entry {
    std::string_view tag;
    std::string_view value;
};

bool isLevel(std::string_view word) {
    return word.size() == 1 && word[0] >= 'A' && word[0] <= 'Z';
}

std::optional<Entry> parseEntry(std::string_view text) {
    std::string_view first = takeWord(&text);
    std::string_view second = takeWord(&text);
    std::string_view level = takeWord(&text);
    if (!isLevel(level)) {
        // The first was the user, a number or a name.
        first = std::exchange(second, level);
        level = takeWord(&text);
    }
    const size_t colon = text.find(':');
    if (!areDigits(first) || !areDigits(second) || !isLevel(level) ||
        colon == std::string_view::npos) {
        return std::nullopt;
    }
    return Entry{trimmed(text.substr(0, colon)), trimmed(text.substr(colon + 1))};
}

int chargeOf(int plugged) {
    return plugged >= kUnplugged && plugged <= kPluggedUsb ? plugged : kPluggedOther;
}

/** "[status,health,present,plugged,technology]" */
std::optional<int> parseCharge(std::string_view status) {
    if (!takePrefix(&status, "[")) return std::nullopt;
    for (int i = 0; i < 3; ++i) takePart(&status, ',');
    const std::string_view plugged = trimmed(status.substr(0, status.find_first_of(",]")));
    const auto number = areDigits(plugged) ? parseNumber<int>(plugged) : std::nullopt;
    return number ? std::optional(chargeOf(*number)) : std::nullopt;
}

std::optional<StateValue> valueOf(const Entry& entry) {
    if (entry.tag == "screen_toggled") {
        // 2 says that the device was unlocked.
        if (entry.value == "0") return StateValue{0, State::kDisplay, kDisplayOff};
        if (entry.value == "1") return StateValue{0, State::kDisplay, kDisplayOn};
    } else if (entry.tag == "battery_status") {
        if (const auto charge = parseCharge(entry.value)) {
            return StateValue{0, State::kCharge, *charge};
        }
    }
    return std::nullopt;
}

}  // namespace

void EventLog::takeLine(std::string_view text) {
    const auto time = parseYearlessStamp(text);
    if (!time) return;
    const auto entry = parseEntry(text.substr(kYearlessStampSize));
    if (entry) take({*time, valueOf(*entry)});
}

void EventLog::finish(int64_t taken) {
    if (mTaken) return;
    mTaken = taken;
    for (const Line& line : std::exchange(mWaiting, {})) take(line);
}

void EventLog::take(const Line& line) {
    if (!mTaken) {
        mWaiting.push_back(line);
        return;
    }
    const auto time = withYear(line.time, *mTaken);
    if (!time) return;
    mTime = std::max(mTime, *time);
    if (!mStart) mStart = mTime;
    if (!line.value) return;
    mValues.push_back(*line.value);
    mValues.back().at = mTime;
}

}  // namespace capture
