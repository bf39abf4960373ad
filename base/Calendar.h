#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

/**
 * Local times of a device, and durations. A device prints no zone: a wall time counts the
 * milliseconds since 1970 as if its zone were UTC and never changed.
 */
namespace base {

inline constexpr int64_t kNsPerMs = 1'000'000;
inline constexpr int64_t kMsPerSecond = 1000;
inline constexpr int64_t kMsPerMinute = 60 * kMsPerSecond;
inline constexpr int64_t kMsPerHour = 60 * kMsPerMinute;
inline constexpr int64_t kMsPerDay = 24 * kMsPerHour;
inline constexpr int64_t kNsPerSecond = kMsPerSecond * kNsPerMs;
inline constexpr int64_t kNsPerHour = kMsPerHour * kNsPerMs;
inline constexpr int64_t kNsPerDay = kMsPerDay * kNsPerMs;

/** The whole units in `time`, rounded down: the day of a time, for instance. */
constexpr int64_t wholeUnits(int64_t time, int64_t unit) {
    return (time < 0 ? time - (unit - 1) : time) / unit;
}

struct Date {
    int64_t year;
    int month;  // 1 to 12
    int day;    // of the month, from 1
};

/** Days from 1970-01-01 to `date`; nothing if there is no such day. Years are 1 to 9999. */
std::optional<int64_t> daysTo(const Date& date);

/** The date of a day, counted from 1970-01-01. */
Date dateOf(int64_t day);

/** Milliseconds since midnight; nothing if there is no such time of day. */
std::optional<int64_t> timeOfDay(int hour, int minute, int second);

/** A day, counted from 1970-01-01, as "2018-04-25". */
std::string formatDate(int64_t day);

/** The day of "2018-04-25"; nothing if `text` is no date. */
std::optional<int64_t> parseDate(std::string_view text);

/** A wall time as "2018-04-25 11:45:07". */
std::string formatStamp(int64_t wallTime);

/** The time of day of a moment counted from any midnight, as "11:45:07". */
std::string formatTimeOfDay(std::chrono::seconds moment);
template <typename Duration>
std::string formatTimeOfDay(Duration moment) {
    return formatTimeOfDay(std::chrono::floor<std::chrono::seconds>(moment));
}

/** A duration as h:mm:ss; parts of a second are left out. */
std::string formatDuration(std::chrono::nanoseconds duration);

}  // namespace base
