#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "base/Calendar.h"

namespace capture {

// Times are wall times, see base/Calendar.h.

using base::kMsPerDay;
using base::kMsPerHour;
using base::kMsPerMinute;
using base::kMsPerSecond;
using base::wholeUnits;

/** `time` without its fraction of a second. */
constexpr int64_t cutToSecond(int64_t time) {
    return wholeUnits(time, kMsPerSecond) * kMsPerSecond;
}

/** "2018-04-25 11:45:07" at the start of `text`; nothing if there is no such moment. */
std::optional<int64_t> parseStamp(std::string_view text);

/** "2018-04-25-11-45-07", which is the whole `text`. */
std::optional<int64_t> parseDashedStamp(std::string_view text);

/** "HH:MM:SS " at the start of `text`, in milliseconds since midnight. */
std::optional<int64_t> parseTimeOfDay(std::string_view text);

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
