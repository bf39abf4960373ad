#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "report/CallReader.h"
#include "report/Report.h"
#include "report/TraceEvents.h"
#include "report/Usage.h"
#include "trace/Failure.h"

namespace report {

/**
 * The day as trace events, for a timeline viewer:
 *  - a process for the device: display, charger, camera, call and boots;
 *  - a process for the library: telemetry, resets, and its counters;
 *  - a process for each app, with a track for each sensor that it holds.
 *
 * Times are those of the virtual clock. Where a boot of the device sets it back, the timeline goes
 * on at the moment at which the boot before it ended.
 */
class Timeline : public Report {
public:
    /** Writes the file `path`, which is made anew; of one input only. */
    explicit Timeline(std::string path);

    const std::optional<trace::Failure>& failure() const override { return mFailure; }

    bool wantsCalls() const override { return true; }
    void begin(const Input& input) override;
    void take(const Record& record) override;
    void end(bool isWhole) override;

private:
    /** A state of the device: since when it is known to be so. */
    struct State {
        std::string name;  // empty: not known
        int64_t since;
    };

    void fail();
    void takeBoot(const Record& record);
    void takeCall(const Record& record, int64_t at);
    void takeEvent(const Record& record, int64_t at);
    void takeCounters(const Record& record, int64_t at);
    void takeSlice(const Slice& slice);
    void change(const char* track, State* state, const std::string& name, int64_t at);
    void showStates(int64_t at);
    void endBoot();

    const std::string mPath;
    std::optional<trace::Failure> mFailure;
    std::unique_ptr<TraceEvents> mEvents;
    Input mInput;
    CallReader mCalls;
    Usage mUsage;
    State mDisplay, mCharge, mCamera, mVoice, mBoot;
    int64_t mOffset = 0;  // from the virtual clock to the timeline, ns
    int64_t mAt = 0;      // on the timeline, ns
};

}  // namespace report
