#include "base/Calendar.h"

#include <array>
#include <charconv>
#include <cstdio>
#include <ctime>

namespace base {

namespace {

std::string formatParts(const char* format, int64_t hours, int64_t seconds) {
    std::array<char, 48> text;
    std::snprintf(text.data(), text.size(), format, static_cast<long long>(hours),
                  static_cast<long long>(seconds / 60 % 60), static_cast<long long>(seconds % 60));
    return text.data();
}

}  // namespace

std::optional<int64_t> daysTo(const Date& date) {
    if (date.year < 1 || date.year > 9999 || date.day < 1) return std::nullopt;
    tm fields{};
    fields.tm_year = static_cast<int>(date.year - 1900);
    fields.tm_mon = date.month - 1;
    fields.tm_mday = date.day;
    // timegm moves a day that the month lacks into the next one.
    const time_t seconds = timegm(&fields);
    if (fields.tm_mon != date.month - 1 || fields.tm_mday != date.day) return std::nullopt;
    return wholeUnits(seconds, kMsPerDay / kMsPerSecond);
}

Date dateOf(int64_t day) {
    const auto seconds = static_cast<time_t>(day * (kMsPerDay / kMsPerSecond));
    tm fields{};
    gmtime_r(&seconds, &fields);
    return {int64_t{fields.tm_year} + 1900, fields.tm_mon + 1, fields.tm_mday};
}

std::optional<int64_t> timeOfDay(int hour, int minute, int second) {
    if (hour < 0 || hour > 23 || minute < 0 || minute > 59 || second < 0 || second > 59) {
        return std::nullopt;
    }
    return hour * kMsPerHour + minute * kMsPerMinute + second * kMsPerSecond;
}

std::string formatDate(int64_t day) {
    const Date date = dateOf(day);
    std::array<char, 48> text;
    std::snprintf(text.data(), text.size(), "%04lld-%02d-%02d", static_cast<long long>(date.year),
                  date.month, date.day);
    return text.data();
}

std::optional<int64_t> parseDate(std::string_view text) {
    Date date{};
    const auto read = [&](size_t begin, size_t size, auto* number) {
        const std::string_view part = text.substr(begin, size);
        return std::from_chars(part.begin(), part.end(), *number).ptr == part.end();
    };
    constexpr size_t kSize = 10;
    if (text.size() != kSize || text[4] != '-' || text[7] != '-' || !read(0, 4, &date.year) ||
        !read(5, 2, &date.month) || !read(8, 2, &date.day)) {
        return std::nullopt;
    }
    return daysTo(date);
}

std::string formatStamp(int64_t wallTime) {
    return formatDate(wholeUnits(wallTime, kMsPerDay)) + ' ' +
           formatTimeOfDay(std::chrono::milliseconds(wallTime));
}

std::string formatTimeOfDay(std::chrono::seconds moment) {
    const int64_t perDay = kMsPerDay / kMsPerSecond;
    const int64_t seconds = moment.count() - wholeUnits(moment.count(), perDay) * perDay;
    return formatParts("%02lld:%02lld:%02lld", seconds / 3600, seconds);
}

std::string formatDuration(std::chrono::nanoseconds duration) {
    const int64_t seconds = duration.count() / kNsPerSecond;
    return formatParts("%lld:%02lld:%02lld", seconds / 3600, seconds);
}

}  // namespace base
