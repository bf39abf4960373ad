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

/** How long the display was on or off, or the charger. */
struct StateSpan {
    int64_t boot;
    Span span;
    bool isOn;
};

struct Boot {
    Span span;
    std::optional<int64_t> firstDay;  // the date of the clock's 0, in days since 1970-01-01
    std::optional<size_t> capture;    // that it is of, in `Journal::captures`
    std::vector<Span> seen;           // when it is known who holds what: without gaps
    DisplayTime display;              // within `seen`
};

/** The part of a capture's time on battery in which it is known who held what. */
struct BatteryCoverage {
    int64_t seen = 0;           // ns
    bool isUpperBound = false;  // the charger is not known all the time
};

/** What happened in one input. Nothing is kept that no view shows. */
struct Journal {
    std::string name;             // of the input, as it was given
    std::vector<Notes> captures;  // what the notes tell of each capture in the input, in order
    std::vector<trace::LostNote> lost;  // the lines of a record that are missing, in order
    std::vector<Boot> boots;
    std::vector<Use> uses;
    DayTable table;
    std::vector<Event> events;
    std::vector<StateSpan> display;
    std::vector<StateSpan> charge;
    std::map<std::string, std::string> properties;  // that the library set, with the last values
    std::vector<DailyCall> dailyCalls;

    const Boot& bootOf(const Use& use) const { return boots[static_cast<size_t>(use.boot)]; }

    /** Whether a boot is of a capture: an index of `captures`. */
    bool isOf(int64_t boot, size_t capture) const {
        return boots[static_cast<size_t>(boot)].capture == capture;
    }

    /** The device's time that was played, all boots together, ns. */
    int64_t played() const;

    /** The days on which a sensor was held or an event was sent, in order. */
    std::vector<Day> days() const;

    /** The events of a day, in order. */
    std::vector<const Event*> eventsOf(const Day& day) const;

    Causes causes() const { return findCauses(uses, dailyCalls); }

    /** When a capture tells who holds what, all its boots together. */
    std::vector<Span> seenOf(size_t capture) const;

    /** Of a capture that has battery statistics. */
    BatteryCoverage batteryCoverage(size_t capture) const;
};

/** Makes the journal of an input out of its records. */
class JournalWriter {
public:
    JournalWriter();

    void begin(const std::string& name);
    void take(const trace::Record& record);

    /** The input is over. The journal is there until the next one begins. */
    const Journal& end();

private:
    void startBoot(const trace::Record& record);
    /** `isLast`: of the device. */
    void endBoot(bool isLast);
    void keepCapture();
    void takeState(const trace::Record& record);

    UseTracker mTracker;
    Journal mJournal;
    size_t mFirstBoot = 0;  // since the clock was set back
};

}  // namespace day
