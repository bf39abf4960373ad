#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>

#include "base/OutputFile.h"
#include "day/UseTracker.h"
#include "report/Report.h"
#include "report/TraceEvents.h"

namespace report {

/**
 * The day as trace events, for a timeline viewer:
 *  - a process for the device: display, charger, camera, call and boots;
 *  - a process for the library: telemetry, resets, and its counters;
 *  - a process for each app, with a track for each sensor that it holds.
 *
 * Where notes say what is known, the rest of a state is "unknown", and the timeline ends with a
 * mark at the moment of the capture.
 *
 * Times are those of the virtual clock. Where a boot of the device sets it back, the timeline goes
 * on at the moment at which the boot before it ended. Several inputs have processes of their own.
 * Those that are dated stand on one clock, which begins at the first day of the first of them.
 */
class TimelineFile : public Report {
public:
    /** Writes `file`, which must outlive this. With `severalInputs` processes bear their names. */
    TimelineFile(base::OutputFile* file, bool severalInputs);

    trace::WantedRecords wanted() const override { return {true, true}; }
    void begin(const std::string& name) override;
    void take(const trace::Record& record) override;
    void end(bool isWhole) override;
    void finish() override { mEvents.close(); }

private:
    /** Something that lasts: since when it does. */
    struct Lasting {
        std::string name;  // empty: nothing does
        int64_t since = 0;
    };

    Process processOf(const Process& process) const;
    void date();
    void startBoot(const trace::Record& record);
    void endBoot();
    void takeEvent(const trace::Record& record);
    void takeCounters(const trace::Record& record);
    void takeUse(const day::Use& use);
    void change(trace::DeviceState state, const std::string& name);
    void writeState(trace::DeviceState state, const std::string& name, day::Span span);
    void endKnown();

    TraceEvents mEvents;
    const bool mSeveralInputs;
    std::string mPrefix;  // of the names of processes
    int64_t mInput = 0;   // its number, from 1
    bool mIsDated = false;
    day::UseTracker mTracker;
    std::array<Lasting, trace::kDeviceStates> mStates;
    Lasting mBoot;
    std::optional<int64_t> mFirstDay;  // of the timeline's clock, in days since 1970-01-01
    int64_t mOffset = 0;               // from the virtual clock to the timeline, ns
    int64_t mAt = 0;                   // on the timeline, ns
};

}  // namespace report
