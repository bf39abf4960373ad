#pragma once

#include <cstdint>
#include <functional>
#include <limits>
#include <map>
#include <optional>
#include <string>
#include <tuple>
#include <vector>

#include "day/Notes.h"
#include "day/Use.h"
#include "trace/Record.h"

namespace day {

/** Uses that have ended and are not told yet: those of one moment are told together, in order. */
class EndedUses {
public:
    static constexpr int64_t kAll = std::numeric_limits<int64_t>::max();

    void add(const Use& use) { mUses.push_back(use); }

    /** Takes those that ended before `before`. */
    std::vector<Use> take(int64_t before);

private:
    std::vector<Use> mUses;
};

/**
 * Follows the records of an input: who holds which sensor, what notes tell, and when the display is
 * on. It counts enables as a person would, and not as the library does: a disable of what is not on
 * means nothing. After what is known has ended, nothing is held.
 */
class UseTracker {
public:
    /** `take` gets each use when it ends, at the latest when the boot does. */
    explicit UseTracker(std::function<void(const Use&)> take) : mTake(std::move(take)) {}

    /** A new input. */
    void begin();

    /** Each record, in order. */
    void take(const trace::Record& record);

    /** The input is over, wherever its process has stopped. */
    void end() { endBoot(); }

    /** The number of the present boot; the first is 0. */
    int64_t boot() const { return mBoot; }

    /** What notes have told so far. */
    const Notes& notes() const { return mNotes; }

    /** Whether the end of what is known has passed, so that no further use ends. */
    bool isClosed() const { return mIsClosed; }

    /** The display within a part of a use that has just ended. */
    DisplayTime displayIn(Span span) const { return mDisplay.within(span, mNotes.displayKnown); }

private:
    /** A client on a sensor: with a note its tag, uid and handle, else its names and the type. */
    using Client =
            std::tuple<std::string, std::optional<int32_t>, std::optional<uint32_t>, int32_t>;

    struct Held {
        Use use;
        int64_t level = 0;  // how many of its enables are on
    };

    using Holdings = std::map<Client, Held>;

    static Client clientOf(const trace::Record& record,
                           const std::optional<trace::RegistrationNote>& note);
    void startBoot(const trace::Record& record);
    void endBoot();
    void passTime(int64_t at);
    std::optional<trace::RegistrationNote> takeNote(std::string_view json);
    void enable(const trace::Record& record);
    void disable(const trace::Record& record);
    void endAll(int64_t at);
    void finish(Holdings::iterator held, int64_t at, End end);

    const std::function<void(const Use&)> mTake;
    Notes mNotes;
    DisplayCourse mDisplay;
    Holdings mHeld;
    int64_t mBoot = -1;
    int64_t mAt = 0;          // the clock, ns
    bool mIsRunning = false;  // a boot is
    bool mIsClosed = false;   // what is known has ended
};

}  // namespace day
