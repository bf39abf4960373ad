#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "base/Calendar.h"
#include "day/Journal.h"

namespace day {

// From when on something is worth a sentence. docs/output.md has these figures, too.
inline constexpr int64_t kLongDark = base::kNsPerHour;           // continuous, display off
inline constexpr int64_t kLongUnbatched = base::kNsPerHour / 6;  // wake-up, display off
inline constexpr int64_t kLongThrough = base::kNsPerHour / 6;    // what is seen at all
inline constexpr int64_t kSeenPercent = 90;                      // less is told
inline constexpr size_t kMostFindings = 7;

/** Something that a person should know first. Times are nanoseconds. */
struct Finding {
    /** The worst first. */
    enum class Kind {
        kLost,       // lines of a record: `count` times, first from `from` to `to`, by `text`
        kDark,       // a continuous sensor was held for `time` with the display off
        kUnbatched,  // a wake-up sensor was, without batching
        kThrough,    // a sensor was on from before all that is seen, `from`, to its end
        kDied,       // a client ended without its disable: `count` times, held for `time` at most
        kRefused,    // enables: `count`, with the result `text`
        kNoAccess,   // a client gets no data
        kUnseen,     // `time` is seen of the day, which began at `from` and ended at `to`
    };

    Kind kind;
    Holder holder;  // whom it concerns
    int64_t time = 0;
    int64_t count = 0;
    int64_t from = 0;
    int64_t to = 0;
    std::string text = {};
    std::optional<size_t> capture = {};  // in which `from` and `to` are
};

/**
 * The findings of an input, the worst first, `kMostFindings` at most. How much is not seen always
 * has its place.
 */
std::vector<Finding> findFindings(const Journal& journal);

}  // namespace day
