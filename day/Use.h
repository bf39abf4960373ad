#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

#include "day/DisplayTime.h"
#include "trace/Note.h"

namespace day {

/** How a use of a sensor ended. */
enum class End {
    kOff,     // the client switched it off
    kFired,   // a one-shot sensor switched itself off
    kUnseen,  // it ended at `Use::to` at the latest
    kOn,      // it was on when the process, the replay or what is known ended
};

/** The word for an end in what programs read. */
constexpr std::string_view nameOf(End end) {
    constexpr std::string_view kNames[] = {"off", "fired", "unseen", "on"};
    return kNames[static_cast<size_t>(end)];
}

struct Enable {
    int64_t at = 0;        // ns
    int64_t periodNs = 0;  // between two samples; 0 or less: as fast as the sensor can
    bool isKnown = true;   // false: the period is a guess
};

/** Who holds which sensor: a client, and the sensor as the device lists it. */
struct Holder {
    std::string pkg;  // the client's tag
    std::string opPkg;
    std::optional<int32_t> uid;
    std::vector<std::string> packages;  // of the uid; empty if they are not known
    std::optional<uint32_t> handle;     // of the sensor
    std::string sensor;                 // its name; empty if that is not known
    int32_t type = 0;                   // of the sensor
    trace::SensorMode mode = trace::SensorMode::kUnknown;
    std::optional<bool> wakeUp;
    std::optional<float> maxRate;  // Hz
};

/**
 * A use of a sensor by a client, from its first enable to its last disable. Times are nanoseconds
 * of the clock.
 */
struct Use : Holder {
    int64_t boot = 0;  // the first is 0
    int64_t from = 0;
    int64_t to = 0;
    bool before = false;  // it was on before `from`
    End end = End::kOff;
    std::vector<Enable> enables;      // at least one, in order
    std::optional<int64_t> periodNs;  // the shortest; nothing if all are guesses
    std::optional<int64_t> batchUs;   // the shortest; -1: as long as possible
    DisplayTime display;
};

inline constexpr int64_t kAsLongAsPossible = -1;  // a batching period

/** What uses come to together; times are nanoseconds. */
struct Total {
    int64_t held = 0;
    DisplayTime display;  // within `held`
    int64_t enables = 0;
    std::optional<int64_t> periodNs;  // the shortest; nothing if all are guesses
    std::optional<int64_t> batchUs;   // the shortest

    void add(const Total& more);
};

/** The shorter of two batching periods, of which one may not be known. */
std::optional<int64_t> shorterBatch(std::optional<int64_t> a, std::optional<int64_t> b);

/** What tells holders apart: tag, uid and handle, else the client's names and the type. */
using HolderKey = std::tuple<std::optional<uint32_t>, int32_t, std::optional<int32_t>, std::string,
                             std::string>;
HolderKey keyOf(const Holder& holder);

/** The client as the library's reports name it: "pkg", or "pkg/opPkg" if they differ. */
std::string appOf(const Holder& holder);

}  // namespace day
