#include "capture/dump/WallTime.h"

#include <array>

#include "base/Calendar.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr int kLeapYear = 2000;            // for moments without a year
constexpr int64_t kLeapYearStart = 10957;  // its first day, since 1970

/** Of hour, minute and second. */
std::optional<int64_t> timeOfDay(const int* fields) {
    return base::timeOfDay(fields[0], fields[1], fields[2]);
}

/** Of year, month, day, hour, minute and second. */
std::optional<int64_t> moment(const int* fields) {
    const auto days = base::daysTo({fields[0], fields[1], fields[2]});
    const auto time = timeOfDay(fields + 3);
    if (!days || !time) return std::nullopt;
    return *days * kMsPerDay + *time;
}

}  // namespace

std::optional<int64_t> parseStamp(std::string_view text) {
    std::array<int, 6> fields;
    if (!readFields(text, "####-##-## ##:##:##", fields.data())) return std::nullopt;
    return moment(fields.data());
}

std::optional<int64_t> parseDashedStamp(std::string_view text) {
    constexpr std::string_view kPattern = "####-##-##-##-##-##";
    std::array<int, 6> fields;
    if (text.size() != kPattern.size() || !readFields(text, kPattern, fields.data())) {
        return std::nullopt;
    }
    return moment(fields.data());
}

std::optional<int64_t> parseTimeOfDay(std::string_view text) {
    std::array<int, 3> fields;
    if (!readFields(text, "##:##:## ", fields.data())) return std::nullopt;
    return timeOfDay(fields.data());
}

std::optional<YearlessTime> parseYearlessStamp(std::string_view text) {
    std::array<int, 6> fields;
    if (!readFields(text, "##-## ##:##:##.###", fields.data())) return std::nullopt;
    const auto days = base::daysTo({kLeapYear, fields[0], fields[1]});
    const auto time = timeOfDay(fields.data() + 2);
    if (!days || !time) return std::nullopt;
    return (*days - kLeapYearStart) * kMsPerDay + *time + fields[5];
}

std::optional<int64_t> withYear(YearlessTime time, int64_t reference) {
    base::Date date = base::dateOf(kLeapYearStart + time / kMsPerDay);
    date.year = base::dateOf(wholeUnits(reference, kMsPerDay)).year;
    const auto inYear = [&]() -> std::optional<int64_t> {
        const auto days = base::daysTo(date);
        return days ? std::optional(*days * kMsPerDay + time % kMsPerDay) : std::nullopt;
    };
    if (const auto found = inYear(); found && *found <= reference + kMsPerDay) return found;
    --date.year;
    return inYear();
}

}  // namespace capture
