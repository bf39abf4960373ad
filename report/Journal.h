#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "report/CallReader.h"
#include "report/DayTable.h"
#include "report/EventText.h"
#include "report/Reasons.h"
#include "report/Report.h"
#include "report/Usage.h"

namespace report {

/** An event, and the boot in which it was. */
struct BootEvent {
    int64_t boot;
    Event event;
};

/** How long a state of the device held, and in which boot; times are nanoseconds. */
struct StateSpan {
    int64_t boot;
    Span span;
    int32_t value;  // of the display: 1 on, 0 off; of the charger: the charge state
};

/** All that a person may want to know of one input, gathered from its records. */
class Journal {
public:
    Journal();

    void begin(const Input& input);
    void take(const Record& record);
    void end();

    const Input& input() const { return mInput; }
    const DayTable& uses() const { return mUses; }
    const std::vector<BootSlice>& slices() const { return mSlices; }
    const std::vector<BootEvent>& events() const { return mEvents; }
    const std::vector<StateSpan>& display() const { return mDisplay; }
    const std::vector<StateSpan>& charge() const { return mCharge; }

    /** The properties that the library has set, with their last values. */
    const std::map<std::string, std::string>& properties() const { return mProperties; }

    int64_t boots() const { return mBoot + 1; }

    /** The device's time that was played, all boots together, ns. */
    int64_t played() const { return mPlayed; }

    /** The days on which a sensor was held or an event was sent, in order. */
    std::vector<Day> days() const;

    /** A day by its date, or by its number if no date is known. */
    std::string nameDay(const Day& day) const;

    std::vector<Reason> reasons() const;

private:
    void takeBoot(const Record& record);
    void takeCall(const Record& record);
    void noteState(std::vector<StateSpan>* spans, int32_t value, int64_t at) const;
    void endBoot();

    Input mInput;
    CallReader mCalls;
    Usage mUsage;
    DayTable mUses;
    std::vector<BootSlice> mSlices;
    std::vector<DailyTick> mReports;
    std::vector<BootEvent> mEvents;
    std::vector<StateSpan> mDisplay;
    std::vector<StateSpan> mCharge;
    std::map<std::string, std::string> mProperties;
    int64_t mBoot = -1;   // number of the present one
    int64_t mAt = 0;      // the clock, ns
    int64_t mBootAt = 0;  // the clock at the boot, ns
    int64_t mPlayed = 0;
};

}  // namespace report
