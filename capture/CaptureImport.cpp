#include "capture/CaptureImport.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <map>
#include <optional>

#include "trace/JsonText.h"

namespace capture {

namespace {

constexpr int64_t kMsPerSecond = 1000;
constexpr int64_t kMsPerHour = 3600 * kMsPerSecond;
constexpr int64_t kMsPerDay = 24 * kMsPerHour;

constexpr int64_t kStartLead = 10 * kMsPerSecond;   // from the start to the oldest registration
constexpr int64_t kResetDelay = 10 * kMsPerSecond;  // from an hour's reports to its resets
constexpr int64_t kEndOfDay = 23 * kMsPerHour + 20 * kMsPerSecond;

constexpr int64_t kMaxPeriodUs = 9'000'000'000'000'000;  // fits 64 bits in nanoseconds

constexpr int kSystemUid = 1000;

/** One line of the list of previous registrations. */
struct Registration {
    int64_t lineNumber;
    int64_t timeOfDay;  // milliseconds
    bool on;
    uint32_t handle;
    std::string package;
    std::optional<int> uid;
    int64_t periodUs = 0;
};

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

bool endsWith(std::string_view text, std::string_view suffix) {
    return text.size() >= suffix.size() && text.substr(text.size() - suffix.size()) == suffix;
}

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view kBlanks = " \t\r";
    const size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos) return {};
    return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

/** The number at the start of `text`, after blanks. */
template <typename Number>
std::optional<Number> parseNumber(std::string_view text, int base = 10) {
    text = trimmed(text);
    Number number{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    return error == std::errc() ? std::optional(number) : std::nullopt;
}

/** A handle is printed with 0x in front, unless it is 0. */
std::optional<uint32_t> parseHandle(std::string_view text) {
    text = trimmed(text);
    if (startsWith(text, "0x")) text.remove_prefix(2);
    return parseNumber<uint32_t>(text, 16);
}

/** What stands behind `key` in `text`, up to the next of `ends` or the end of the line. */
std::optional<std::string_view> valueOf(std::string_view text, std::string_view key,
                                        std::initializer_list<std::string_view> ends = {}) {
    const size_t found = text.find(key);
    if (found == std::string_view::npos) return std::nullopt;
    std::string_view value = text.substr(found + key.size());
    for (const std::string_view end : ends) value = value.substr(0, value.find(end));
    return trimmed(value);
}

/** "HH:MM:SS" and a blank at the start of `text`, in milliseconds; taken off `text`. */
std::optional<int64_t> takeTimeOfDay(std::string_view* text) {
    const auto number = [&](size_t at) {
        const int tens = (*text)[at] - '0';
        const int ones = (*text)[at + 1] - '0';
        return tens < 0 || tens > 9 || ones < 0 || ones > 9 ? 99 : tens * 10 + ones;
    };
    if (text->size() < 9 || (*text)[2] != ':' || (*text)[5] != ':' || (*text)[8] != ' ') {
        return std::nullopt;
    }
    const int hour = number(0), minute = number(3), second = number(6);
    if (hour > 23 || minute > 59 || second > 59) return std::nullopt;
    *text = trimmed(text->substr(8));
    return ((hour * 60 + minute) * 60 + second) * kMsPerSecond;
}

/** Takes `word` and the blank behind it off `text`. */
bool takeWord(std::string_view* text, std::string_view word) {
    if (!startsWith(*text, word) || text->substr(word.size(), 1) != " ") return false;
    *text = trimmed(text->substr(word.size()));
    return true;
}

std::optional<Registration> parseRegistration(std::string_view text, int64_t lineNumber) {
    const auto timeOfDay = takeTimeOfDay(&text);
    if (!timeOfDay) return std::nullopt;
    const bool byName = startsWith(text, "activated ") || startsWith(text, "de-activated ");
    const bool on = takeWord(&text, "+") || takeWord(&text, "activated");
    if (!on && !takeWord(&text, "-") && !takeWord(&text, "de-activated")) return std::nullopt;

    const auto handle = parseHandle(byName ? valueOf(text, "handle=").value_or("") : text);
    auto package = valueOf(text, "package=", {" handle=", " samplingPeriod=", " samplingRate="});
    if (!package) {
        // "... result=OK (sensor, package): (NAME, PACKAGE)"; the name may hold commas.
        const auto pair = valueOf(text, "result=OK (sensor, package): (");
        const size_t comma = pair ? pair->rfind(", ") : std::string_view::npos;
        if (comma == std::string_view::npos || !endsWith(*pair, ")")) return std::nullopt;
        package = trimmed(pair->substr(comma + 2, pair->size() - comma - 3));
    }
    if (!handle || package->empty()) return std::nullopt;

    Registration registration{lineNumber, *timeOfDay, on, *handle, std::string(*package), {}};
    if (const auto uid = valueOf(text, "uid=")) registration.uid = parseNumber<int>(*uid);
    if (on) {
        auto period = valueOf(text, "samplingPeriod=");
        if (!period) period = valueOf(text, "samplingRate=");
        const auto number = parseNumber<int64_t>(period.value_or(""));
        if (!number || *number < -kMaxPeriodUs || *number > kMaxPeriodUs) return std::nullopt;
        registration.periodUs = *number;
    }
    return registration;
}

/** Finds the list of sensors and the registrations among everything else. */
class CaptureReader {
public:
    std::map<uint32_t, int> types;            // of the sensors, by handle
    std::vector<Registration> registrations;  // newest first
    bool isCapture = false;                   // it looks like a capture or a bug report
    bool hasService = false;                  // it holds the sensor service's text
    bool hasNoSensors = false;

    void line(std::string_view text, int64_t lineNumber) {
        text = unquoted(text);
        if (startsWith(text, "DUMP OF SERVICE ")) {
            startService(text);
        } else if (mInService) {
            serviceLine(text, lineNumber);
        }
        if (startsWith(text, "== dumpstate")) isCapture = true;
    }

private:
    enum class Section { kSensors, kRegistrations, kEnded };

    /** Without what editors, terminals and chats put before and behind a line. */
    static std::string_view unquoted(std::string_view text) {
        if (startsWith(text, "\xEF\xBB\xBF")) text.remove_prefix(3);
        text = trimmed(text);
        while (startsWith(text, ">")) text = trimmed(text.substr(1));
        return text;
    }

    /** What stood before was another service's, or a bug report's other sections. */
    void startService(std::string_view text) {
        isCapture = true;
        mInService = endsWith(text, " sensorservice:") && registrations.empty();
        if (!mInService) return;
        hasService = true;
        mSection = Section::kSensors;
        types.clear();
    }

    void serviceLine(std::string_view text, int64_t lineNumber) {
        if (text == "Sensor List:" || text == "Sensor Device:") {
            isCapture = hasService = true;
        } else if (startsWith(text, "No Sensors on the device")) {
            isCapture = hasService = hasNoSensors = true;
        } else if (startsWith(text, "Previous Registrations:")) {
            isCapture = hasService = true;
            if (registrations.empty()) mSection = Section::kRegistrations;
        } else if (mSection == Section::kSensors) {
            sensorLine(text);
        } else if (mSection == Section::kRegistrations) {
            registrationLine(text, lineNumber);
        }
    }

    /** "HANDLE) NAME | VENDOR | ver: N | type: STRING(NUMBER) | ..." */
    void sensorLine(std::string_view text) {
        const size_t bracket = text.find(") ");
        const auto type = valueOf(text, "| type: ", {" | "});
        if (bracket == std::string_view::npos || !type) return;
        const size_t number = type->rfind('(');
        if (number == std::string_view::npos) return;
        const auto handle = parseHandle(text.substr(0, bracket));
        const auto value = parseNumber<int>(type->substr(number + 1));
        if (handle && value) types.emplace(*handle, *value);
    }

    /**
     * A maker's own line may stand between registrations; an empty line, a heading or the
     * service's footer ends them.
     */
    void registrationLine(std::string_view text, int64_t lineNumber) {
        if (auto registration = parseRegistration(text, lineNumber)) {
            registrations.push_back(std::move(*registration));
        } else if (text.empty() || endsWith(text, ":") || startsWith(text, "-----")) {
            mSection = Section::kEnded;
        }
    }

    bool mInService = true;  // a capture may hold nothing else
    Section mSection = Section::kSensors;
};

/** Writes the calls of a day, in the order of their times. */
class TraceWriter {
public:
    /** From the start of the host, in milliseconds since midnight. */
    TraceWriter(int64_t start, std::string* trace) : mTrace(trace) {
        call(start, "SDCImpl.getInstance", "");
        call(start, "FlowingDataException.notifyBootCompleted", "");
        call(start, "SDCImpl.sendBootShutdownRebootState", "1");
        call(start, "SDCImpl.sendUsedTime", "1");
        mNextHour = start / kMsPerHour + 1;
    }

    void registration(int64_t at, const Registration& registration, int type) {
        ticksUpTo(at);
        const bool system = registration.uid == kSystemUid;
        const std::string package = trace::toJson(registration.package);
        const int64_t rate = registration.on ? registration.periodUs * 1000 : 0;
        call(at, "SDCImpl.enableSuccess",
             std::string(registration.on ? "true" : "false") + ", " + std::to_string(type) + ", " +
                     package + ", " + (system ? trace::toJson("android") : package) + ", " +
                     std::to_string(rate));
    }

    void end(int64_t at) {
        ticksUpTo(at);
        *mTrace += "{\"at\": " + std::to_string(at) + "}\n";
    }

private:
    /** The hourly calls due at or before `time` that have not been made. */
    void ticksUpTo(int64_t time) {
        for (;; mReset = !mReset) {
            const int64_t at = mNextHour * kMsPerHour + (mReset ? kResetDelay : 0);
            if (at > time) return;
            const std::string hour = std::to_string(mNextHour % 24);
            if (mReset) {
                call(at, "SDCImpl.notifySdcReset", hour);
                call(at, "SDCImpl.notifyRgbShotReset", hour);
                call(at, "SDCImpl.notifyUltraReset", hour);
                ++mNextHour;
            } else {
                if (mNextHour % 24 == 0) {
                    call(at, "SDCImpl.sendUsedTime", std::to_string(mNextHour / 24 + 1));
                }
                call(at, "SDCImpl.notifySdcClock", hour);
                call(at, "SDCImpl.putRgbShotTally", hour);
                call(at, "SDCImpl.putPhoneOpenUltraTally", hour);
            }
        }
    }

    void call(int64_t at, std::string_view name, std::string_view arguments) {
        *mTrace += "{\"at\": " + std::to_string(at) + ", \"call\": \"";
        mTrace->append(name).append("\"");
        if (!arguments.empty()) mTrace->append(", \"args\": [").append(arguments).append("]");
        mTrace->append("}\n");
    }

    std::string* const mTrace;
    int64_t mNextHour;    // since midnight of the first day
    bool mReset = false;  // of that hour's calls, the reports have been made
};

std::string missing(const CaptureReader& capture) {
    if (!capture.hasService) return "no sensor service in the bug report";
    if (capture.hasNoSensors) return "no sensors on the device, so no registrations";
    return capture.registrations.empty() ? "no previous registrations" : "";
}

void writeTrace(const std::string& name, const CaptureReader& capture, ImportedCapture* result) {
    const auto warn = [&](int64_t lineNumber, const std::string& text) {
        result->warnings.push_back(name + ':' + std::to_string(lineNumber) + ": warning: " + text);
    };
    int64_t time = capture.registrations.back().timeOfDay;
    TraceWriter writer(std::max<int64_t>(time - kStartLead, 0), &result->trace);
    int64_t leftOut = 0;
    int64_t firstLeftOut = 0;
    for (auto it = capture.registrations.rbegin(); it != capture.registrations.rend(); ++it) {
        const int64_t change = it->timeOfDay - time % kMsPerDay;
        if (change >= 0) {
            time += change;
        } else if (change < -kMsPerDay / 2) {
            time += change + kMsPerDay;
        } else {
            warn(it->lineNumber, "the clock was set back; the time of the line before it stands");
        }
        const auto type = capture.types.find(it->handle);
        if (type == capture.types.end()) {
            if (leftOut++ == 0) firstLeftOut = it->lineNumber;
            continue;
        }
        writer.registration(time, *it, type->second);
    }
    if (leftOut > 0) {
        warn(firstLeftOut, std::to_string(leftOut) +
                                   " registrations left out: their sensors are not in the list");
    }
    const int64_t days = (time - kEndOfDay + kMsPerDay - 1) / kMsPerDay;
    writer.end(std::max<int64_t>(days, 0) * kMsPerDay + kEndOfDay);
}

}  // namespace

ImportedCapture importCapture(const std::string& name, std::string_view firstLine,
                              trace::LineReader* reader) {
    ImportedCapture result;
    CaptureReader capture;
    const int64_t firstNumber = reader->lineNumber();
    capture.line(firstLine, firstNumber);
    while (const auto line = reader->next()) capture.line(*line, reader->lineNumber());

    if (reader->error()) {
        result.error = name + ':' + std::to_string(reader->lineNumber()) + ": " + *reader->error();
    } else if (!capture.isCapture) {
        result.error = name + ':' + std::to_string(firstNumber) +
                       ": neither a JSON object nor part of a device capture";
    } else if (const std::string what = missing(capture); !what.empty()) {
        result.error = name + ": " + what;
    } else {
        writeTrace(name, capture, &result);
    }
    return result;
}

}  // namespace capture
