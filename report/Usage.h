#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "report/DeviceState.h"
#include "trace/TraceLine.h"

namespace report {

/** An enable of a sensor: when, in nanoseconds, and its sampling period in nanoseconds. */
struct Enable {
    int64_t at;
    int64_t periodNs;
};

/** A sensor held by an app, from the first enable to the last disable. Times are nanoseconds. */
struct Slice {
    std::string app;  // "pkg", or "pkg/opPkg" if they differ
    int32_t type;     // of the sensor
    int64_t from;
    int64_t to;
    std::vector<Enable> enables;  // at least one, in order
    bool isOpen;                  // it was still held when the process, or the replay, ended
};

/** From `from` to `to`, in nanoseconds. */
struct Span {
    int64_t from;
    int64_t to;
};

/** For how much of a span the display is known, and for how much of that it was on; ns. */
struct DisplayTime {
    int64_t known = 0;
    int64_t on = 0;
};

/** The share of the known time for which the display was on, as "46 %"; "-" if none is known. */
std::string formatShare(const DisplayTime& time);

/**
 * Follows which app holds which sensor, and when the display is on, through one boot of a trace.
 * Counting is a person's: a disable of what is not held means nothing.
 */
class Usage {
public:
    /** `take` gets each slice when it ends. */
    explicit Usage(std::function<void(const Slice&)> take) : mTake(std::move(take)) {}

    /** A call at `at`, nanoseconds. */
    void call(int64_t at, const trace::Call& call);

    /** Ends all that is open; the next call belongs to a new boot. */
    void end(int64_t at);

    const DeviceState& state() const { return mState; }

    /** The display within `span`, which must not end later than the last call. */
    DisplayTime displayIn(Span span) const;

private:
    struct Held {
        Slice slice;
        int64_t count;  // enables minus disables
    };
    struct DisplayChange {
        int64_t at;
        bool isOn;
    };

    void enable(int64_t at, const std::string& app, int32_t type, int64_t periodNs);
    void disable(int64_t at, const std::string& app, int32_t type);

    const std::function<void(const Slice&)> mTake;
    DeviceState mState;
    std::map<std::pair<std::string, int32_t>, Held> mHeld;  // by app and type
    std::vector<DisplayChange> mDisplay;                    // in order
};

/** An app as reports name it. */
std::string nameApp(const std::string& pkg, const std::string& opPkg);

}  // namespace report
