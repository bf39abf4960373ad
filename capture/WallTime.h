#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace capture {

// Times are local time of the device in milliseconds since 1970, as if its zone were UTC and never
// changed: what a device prints has no zone.

inline constexpr int64_t kMsPerSecond = 1000;
inline constexpr int64_t kMsPerMinute = 60 * kMsPerSecond;
inline constexpr int64_t kMsPerHour = 60 * kMsPerMinute;
inline constexpr int64_t kMsPerDay = 24 * kMsPerHour;

/** The whole units in `time`, rounded down: the day of a time, for instance. */
constexpr int64_t wholeUnits(int64_t time, int64_t unit) {
    return (time < 0 ? time - (unit - 1) : time) / unit;
}

/** "2018-04-25 11:45:07" at the start of `text`; nothing if there is no such moment. */
std::optional<int64_t> parseStamp(std::string_view text);

/** "2018-04-25-11-45-07", which is the whole `text`. */
std::optional<int64_t> parseDashedStamp(std::string_view text);

/** "HH:MM:SS " at the start of `text`, in milliseconds since midnight. */
std::optional<int64_t> parseTimeOfDay(std::string_view text);

/** "2018-04-25 11:45:07" */
std::string formatStamp(int64_t time);

/** "11:45:07", of a moment of any day */
std::string formatTimeOfDay(int64_t time);

/** A moment without a year, as logs print it: in milliseconds since the start of a leap year. */
using YearlessTime = int64_t;

/** "04-25 11:45:07.123" at the start of `text`. */
std::optional<YearlessTime> parseYearlessStamp(std::string_view text);

/** How many characters `parseYearlessStamp` reads. */
inline constexpr size_t kYearlessStampSize = 18;

/**
 * The moment with a year: that of `reference`, when the capture was taken, or the one before if the
 * moment would lie more than a day after it or is a 29 February that the year lacks. Nothing if the
 * year before lacks it, too.
 */
std::optional<int64_t> withYear(YearlessTime time, int64_t reference);

}  // namespace capture
