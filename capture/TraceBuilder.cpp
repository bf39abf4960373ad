#include "capture/TraceBuilder.h"

#include <algorithm>
#include <utility>

#include "capture/CaptureOrigin.h"
#include "capture/WallTime.h"
#include "trace/Failure.h"

namespace capture {

namespace {

constexpr int64_t kStartLead = 10 * kMsPerSecond;      // from the start to the oldest registration
constexpr int64_t kLongestReport = 15 * kMsPerMinute;  // from a report's header to its end

/** No registration of the dump is later, if that is known. */
std::optional<int64_t> latest(const Dump& dump) {
    if (dump.footer || !dump.header) return dump.footer;
    return *dump.header + kLongestReport;
}

/** The oldest line first, as they were made. */
std::vector<Registration> takeLines(Dump* dump) {
    std::vector<Registration> lines = std::move(dump->registrations.registrations());
    std::reverse(lines.begin(), lines.end());
    return lines;
}

/** Only if all are dated; two dumps may have the same date. */
void sortByDate(std::vector<Source>* sources) {
    const auto isDated = [](const Source& source) { return latest(source.dump).has_value(); };
    if (!std::all_of(sources->begin(), sources->end(), isDated)) return;
    std::stable_sort(sources->begin(), sources->end(), [](const Source& a, const Source& b) {
        return latest(a.dump) < latest(b.dump);
    });
}

}  // namespace

void TraceBuilder::build() {
    joinDumps();
    mStart = std::max<int64_t>(mDating.times.front() - kStartLead, 0);
    readStates();
    writeTrace();
    mResult.origin = originOf(mSources, mJoined, mDating, mStates, mStart);
}

void TraceBuilder::joinDumps() {
    sortByDate(&mSources);
    DumpJoin join;
    std::vector<std::optional<int64_t>> taken;
    for (Source& source : mSources) {
        taken.push_back(latest(source.dump));
        join.add(takeLines(&source.dump), taken.back());
    }
    mJoined = join.finish();
    mDating = dateLines(mJoined, taken);
    for (const size_t line : mJoined.gaps) {
        warn(mJoined.lines[line], "registrations are missing from " + printedTime(line - 1) +
                                          " to " + printedTime(line));
    }
    for (const size_t line : mDating.setBack) {
        warn(mJoined.lines[line], "the clock was set back; the time of the line before it stands");
    }
}

void TraceBuilder::readStates() {
    for (const JoinedDump& dump : mJoined.dumps) {
        const Source& source = mSources[dump.dump];
        const StateCourse course = statesOf(source);
        if (const auto end = endOf(dump)) mStates.add(course, *end);
    }
}

StateCourse TraceBuilder::statesOf(const Source& source) {
    const Dump& dump = source.dump;
    const BatteryHistory* history =
            dump.history && dump.history->hasLines() ? &*dump.history : nullptr;
    const EventLog* log = dump.log && dump.log->hasLines() ? &*dump.log : nullptr;
    if (history == nullptr && log == nullptr) return {};
    if (!dump.header && !dump.footer) {
        warn(source.name, history != nullptr ? dump.historyStart : dump.logStart,
             "no display, charger, camera or calls: the capture does not say when it was taken");
        return {};
    }
    if (history != nullptr && !history->hasTimes()) {
        warn(source.name, dump.historyStart,
             "the battery history is left out: it has no TIME line");
        history = nullptr;
    }
    if (history != nullptr) warnOfRuns(source);
    return mergeSources(history, log);
}

std::optional<int64_t> TraceBuilder::endOf(const JoinedDump& dump) const {
    const Dump& source = mSources[dump.dump].dump;
    if (source.footer || !source.header) return source.footer;
    return std::max(*source.header, mDating.wallTime(mDating.times[dump.last]));
}

void TraceBuilder::warnOfRuns(const Source& source) {
    int64_t count = 0;
    int64_t first = 0;
    const int64_t oldest = mDating.wallTime(mDating.times.front()) + kMsPerSecond;
    for (const SystemRun& run : source.dump.history->systemRuns()) {
        if (run.at < oldest || mStates.isKnownUpTo(run.at)) continue;
        if (count++ == 0) first = run.lineNumber;
    }
    if (count == 0) return;
    warn(source.name, first,
         "the system started or went down after the oldest registration (lines: " +
                 std::to_string(count) + ")");
}

void TraceBuilder::writeTrace() {
    HostDay day(&mResult.trace);
    day.start(mStart);
    std::vector<StateValue> changes;
    if (mDating.firstDay) changes = changesFrom(mDating.wallTime(mStart), mStates.finish());
    auto change = changes.begin();
    const auto writeChangesUpTo = [&](int64_t time) {
        for (; change != changes.end() && mDating.traceTime(change->at) <= time; ++change) {
            day.state(mDating.traceTime(change->at), change->state, change->value);
        }
    };
    for (size_t line = 0; line < mJoined.lines.size(); ++line) {
        writeChangesUpTo(mDating.times[line]);
        writeLine(line, &day);
    }
    writeChangesUpTo(INT64_MAX);
    day.end(mDating.times.back());
    if (mLeftOut.empty()) return;
    warn(*mLeftOut.front(), std::to_string(mLeftOut.size()) +
                                    " registrations left out: their sensors are not in the list");
}

void TraceBuilder::writeLine(size_t line, HostDay* day) {
    const DumpLine& dumpLine = mJoined.lines[line];
    if (const auto type = typeOf(dumpLine)) {
        day->registration(mDating.times[line], dumpLine.registration, *type);
    } else {
        mLeftOut.push_back(&dumpLine);
    }
}

std::optional<int32_t> TraceBuilder::typeOf(const DumpLine& line) const {
    return mSources[line.dump].dump.sensors.typeOf(line.registration.handle);
}

std::string TraceBuilder::printedTime(size_t line) const {
    const int64_t time = mDating.times[line];
    return mDating.firstDay ? formatStamp(mDating.wallTime(time)) : formatTimeOfDay(time);
}

void TraceBuilder::warn(const std::string& file, int64_t lineNumber, const std::string& text) {
    mResult.warnings.push_back(trace::at(file, lineNumber) + "warning: " + text);
}

void TraceBuilder::warn(const DumpLine& line, const std::string& text) {
    warn(mSources[line.dump].name, line.registration.lineNumber, text);
}

}  // namespace capture
