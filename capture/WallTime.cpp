#include "capture/WallTime.h"

#include <array>
#include <cstdio>

#include "capture/CaptureText.h"

namespace capture {

namespace {

constexpr int kLeapYear = 2000;  // for moments without a year

struct Date {
    int64_t year;
    int month;
    int day;
};

constexpr bool isLeap(int64_t year) {
    return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
}

int daysInMonth(int64_t year, int month) {
    constexpr std::array<int, 12> kDays = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    return kDays[static_cast<size_t>(month - 1)] + (month == 2 && isLeap(year) ? 1 : 0);
}

/** Days from 1970-01-01 to the start of the year. */
int64_t daysToYear(int64_t year) {
    const int64_t before = year - 1;
    return before * 365 + before / 4 - before / 100 + before / 400 - 719162;
}

bool isDate(const Date& date) {
    return date.month >= 1 && date.month <= 12 && date.day >= 1 &&
           date.day <= daysInMonth(date.year, date.month);
}

int64_t daysTo(const Date& date) {
    int64_t days = daysToYear(date.year) + date.day - 1;
    for (int month = 1; month < date.month; ++month) days += daysInMonth(date.year, month);
    return days;
}

Date dateOf(int64_t days) {
    Date date{1970 + wholeUnits(days, days < 0 ? 365 : 366), 1, 1};  // not later than it is
    while (daysToYear(date.year + 1) <= days) ++date.year;
    int64_t rest = days - daysToYear(date.year);
    for (; rest >= daysInMonth(date.year, date.month); ++date.month) {
        rest -= daysInMonth(date.year, date.month);
    }
    date.day = static_cast<int>(rest) + 1;
    return date;
}

/** Of hour, minute and second. */
std::optional<int64_t> timeOfDay(const int* fields) {
    if (fields[0] > 23 || fields[1] > 59 || fields[2] > 59) return std::nullopt;
    return fields[0] * kMsPerHour + fields[1] * kMsPerMinute + fields[2] * kMsPerSecond;
}

/** Of year, month, day, hour, minute and second. */
std::optional<int64_t> moment(const int* fields) {
    const Date date{fields[0], fields[1], fields[2]};
    const auto time = timeOfDay(fields + 3);
    if (date.year < 1 || !isDate(date) || !time) return std::nullopt;
    return daysTo(date) * kMsPerDay + *time;
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

std::string formatStamp(int64_t time) {
    const Date date = dateOf(wholeUnits(time, kMsPerDay));
    std::array<char, 64> text;
    std::snprintf(text.data(), text.size(), "%04lld-%02d-%02d ", static_cast<long long>(date.year),
                  date.month, date.day);
    return text.data() + formatTimeOfDay(time);
}

std::string formatTimeOfDay(int64_t time) {
    const int64_t seconds = wholeUnits(time, kMsPerSecond) - wholeUnits(time, kMsPerDay) * 86400;
    std::array<char, 16> text;
    std::snprintf(text.data(), text.size(), "%02d:%02d:%02d", static_cast<int>(seconds / 3600),
                  static_cast<int>(seconds / 60 % 60), static_cast<int>(seconds % 60));
    return text.data();
}

std::optional<YearlessTime> parseYearlessStamp(std::string_view text) {
    std::array<int, 6> fields;
    if (!readFields(text, "##-## ##:##:##.###", fields.data())) return std::nullopt;
    const Date date{kLeapYear, fields[0], fields[1]};
    const auto time = timeOfDay(fields.data() + 2);
    if (!isDate(date) || !time) return std::nullopt;
    return (daysTo(date) - daysToYear(kLeapYear)) * kMsPerDay + *time + fields[5];
}

std::optional<int64_t> withYear(YearlessTime time, int64_t reference) {
    const int64_t day = time / kMsPerDay;
    Date date = dateOf(daysToYear(kLeapYear) + day);
    date.year = dateOf(wholeUnits(reference, kMsPerDay)).year;
    const auto inYear = [&] { return daysTo(date) * kMsPerDay + time % kMsPerDay; };
    if (!isDate(date) || inYear() > reference + kMsPerDay) --date.year;
    return isDate(date) ? std::optional(inYear()) : std::nullopt;
}

}  // namespace capture
