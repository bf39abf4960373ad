#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "report/CallReader.h"
#include "report/DayTable.h"
#include "report/EventText.h"
#include "report/Reasons.h"
#include "report/Report.h"
#include "report/Stdout.h"
#include "report/Usage.h"

namespace report {

/** What a person wants to know first of each input: who used what, and what the device reports. */
class Summary : public Report {
public:
    /** `showsAll`: tables show all rows, not the first 20. */
    Summary(Stdout* out, bool showsAll, bool hasColours);

    bool wantsCalls() const override { return true; }
    void begin(const Input& input) override;
    void take(const Record& record) override;
    void end(bool isWhole) override;

private:
    struct BootEvent {
        int64_t boot;
        Event event;
    };

    void takeBoot(const Record& record);
    void takeCall(const Record& record);
    void endBoot();

    void printOrigin();
    void printDays();
    void printDay(const Day& day);
    void printReasons();
    void printProperties();
    void printEnd(bool isWhole);
    std::string nameDay(const Day& day) const;
    std::string heading(const std::string& text) const;

    Stdout* const mOut;
    const size_t mLimit;
    const bool mHasColours;

    // Of the present input.
    Input mInput;
    CallReader mCalls;
    Usage mUsage;
    DayTable mDays;
    std::vector<BootSlice> mSlices;
    std::vector<DailyTick> mReports;
    std::vector<BootEvent> mEvents;
    std::map<std::string, std::string> mProperties;  // those that the library has set
    int64_t mBoot = -1;                              // number of the present one
    int64_t mAt = 0;                                 // the clock, ns
    int64_t mBootAt = 0;                             // the clock at the boot, ns
    int64_t mPlayed = 0;                             // ns of all boots before
    int64_t mStarted = 0;                            // real time, ns
};

}  // namespace report
