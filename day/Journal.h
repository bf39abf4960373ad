#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "day/Causes.h"
#include "day/DayTable.h"
#include "day/Payload.h"
#include "day/UseTracker.h"
#include "trace/Record.h"

namespace day {

/** An event that the device reports. */
struct Event {
    int64_t boot;  // the first is 0
    int64_t at;    // ns
    std::string id;
    Payload payload;
    bool isAhead;  // it lies after what is known: the device would report it if nothing changed
};

/** How long a state of the device held. */
struct StateSpan {
    int64_t boot;
    Span span;
    int64_t value;  // see trace::DeviceState
};

struct Boot {
    Span span;
    std::optional<int64_t> firstDay;  // the date of the clock's 0, in days since 1970-01-01
    std::optional<size_t> capture;    // that it is of, in `captures()`
    std::vector<Span> seen;           // when it is known who holds what: without gaps
    DisplayTime display;              // within `seen`
};

/** What happened in one input, gathered from its records. Nothing is kept that no view shows. */
class Journal {
public:
    Journal();

    void begin(const std::string& name);
    void take(const trace::Record& record);
    void end();

    /** The input's name as it was given. */
    const std::string& name() const { return mName; }

    /** What the notes tell of each capture in the input, in order. */
    const std::vector<Notes>& captures() const { return mCaptures; }

    /** Whether a boot is of a capture: an index of `captures()`. */
    bool isOf(int64_t boot, size_t capture) const {
        return mBoots[static_cast<size_t>(boot)].capture == capture;
    }

    /** The lines of a record that are missing, in order. */
    const std::vector<trace::LostNote>& lost() const { return mLost; }

    const std::vector<Boot>& boots() const { return mBoots; }
    const std::vector<Use>& uses() const { return mUses; }
    const DayTable& table() const { return mTable; }
    const std::vector<Event>& events() const { return mEvents; }
    const std::vector<StateSpan>& display() const { return mDisplay; }
    const std::vector<StateSpan>& charge() const { return mCharge; }

    /** The properties that the library has set, with their last values. */
    const std::map<std::string, std::string>& properties() const { return mProperties; }

    /** The device's time that was played, all boots together, ns. */
    int64_t played() const;

    /** The days on which a sensor was held or an event was sent, in order. */
    std::vector<Day> days() const;

    /** The events of a day, in order. */
    std::vector<const Event*> eventsOf(const Day& day) const;

    Causes causes() const { return findCauses(mUses, mDailyCalls); }

private:
    void startBoot(const trace::Record& record);
    /** `isLast`: of the device. */
    void endBoot(bool isLast);
    void keepCapture();
    void takeState(const trace::Record& record);

    std::string mName;
    UseTracker mTracker;
    std::vector<Notes> mCaptures;
    std::vector<trace::LostNote> mLost;
    size_t mFirstBoot = 0;  // since the clock was set back
    std::vector<Boot> mBoots;
    std::vector<Use> mUses;
    DayTable mTable;
    std::vector<DailyCall> mDailyCalls;
    std::vector<Event> mEvents;
    std::vector<StateSpan> mDisplay;
    std::vector<StateSpan> mCharge;
    std::map<std::string, std::string> mProperties;
};

}  // namespace day
