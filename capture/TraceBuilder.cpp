#include "capture/TraceBuilder.h"

#include <algorithm>
#include <iterator>
#include <tuple>
#include <utility>

#include "base/Calendar.h"
#include "capture/TraceText.h"
#include "capture/dump/WallTime.h"

namespace capture {

namespace {

constexpr int64_t kStartLead = 10 * kMsPerSecond;      // from the start to the oldest registration
constexpr int64_t kLongestReport = 15 * kMsPerMinute;  // from a report's header to its end

/** No registration of the dump is later, if that is known. */
std::optional<int64_t> latest(const Dump& dump) {
    if (dump.service.footer || !dump.header) return dump.service.footer;
    return *dump.header + kLongestReport;
}

/** The oldest line first, as they were made. */
std::vector<Registration> takeLines(Dump* dump) {
    std::vector<Registration> lines = std::move(dump->registrations.registrations());
    std::reverse(lines.begin(), lines.end());
    return lines;
}

/** Only if all are dated; two dumps may have the same date. */
void sortByDate(std::vector<NamedDump>* dumps) {
    const auto isDated = [](const NamedDump& dump) { return latest(dump.dump).has_value(); };
    if (!std::all_of(dumps->begin(), dumps->end(), isDated)) return;
    std::stable_sort(dumps->begin(), dumps->end(), [](const NamedDump& a, const NamedDump& b) {
        return latest(a.dump) < latest(b.dump);
    });
}

/**
 * Each part's firings, up to the lines of the next one. Of what happens in a gap the dumps on both
 * sides may tell.
 */
std::vector<Firing> allFirings(const std::vector<Part>& parts, const Dating& dating) {
    std::vector<Firing> all;
    for (auto part = parts.begin(); part != parts.end(); ++part) {
        const auto next = std::next(part);
        const int64_t from = part->first > 0 ? dating.times[part->first - 1] + 1 : INT64_MIN;
        const int64_t to = next != parts.end() ? dating.times[next->first] : INT64_MAX;
        for (const Firing& firing : firingsOf(*part->dump, dating, part->newestLine)) {
            if (firing.at >= from && firing.at < to) all.push_back(firing);
        }
    }
    const auto key = [](const Firing& firing) { return std::tuple(firing.at, firing.handle); };
    std::sort(all.begin(), all.end(),
              [&](const Firing& a, const Firing& b) { return key(a) < key(b); });
    all.erase(std::unique(all.begin(), all.end(),
                          [&](const Firing& a, const Firing& b) { return key(a) == key(b); }),
              all.end());
    return all;
}

bool isSameSensor(const trace::Sensor& a, const trace::Sensor& b) {
    return a.handle == b.handle && a.type == b.type && a.name == b.name;
}

bool haveSameSensors(const Dump& a, const Dump& b) {
    const auto& left = a.service.sensors.sensors();
    const auto& right = b.service.sensors.sensors();
    return std::equal(left.begin(), left.end(), right.begin(), right.end(), isSameSensor);
}

/** Of one system, as far as both name it in the same way. */
bool haveSameBuild(const Dump& a, const Dump& b) {
    const auto differ = [](const std::string& left, const std::string& right) {
        return !left.empty() && !right.empty() && left != right;
    };
    return !differ(a.build, b.build) && !differ(a.statistics.build(), b.statistics.build());
}

}  // namespace

base::Result<ImportedCapture> TraceBuilder::build() {
    if (auto failure = joinDumps()) return tl::unexpected(std::move(*failure));
    mDay.start = std::max<int64_t>(mDay.dating.times.front() - kStartLead, 0);
    readUses();
    readStates();
    warnOfStrangers();
    warnOfLeftOut();
    std::string trace = traceOf(mDay);
    return ImportedCapture{mDay.start, std::move(trace), std::move(mDay.warnings)};
}

std::optional<base::Failure> TraceBuilder::joinDumps() {
    sortByDate(&mDay.dumps);
    DumpJoin join;
    std::vector<std::optional<int64_t>> taken;
    for (NamedDump& dump : mDay.dumps) {
        taken.push_back(latest(dump.dump));
        join.add(takeLines(&dump.dump), taken.back());
    }
    mDay.joined = join.finish();
    if (const auto& apart = mDay.joined.unordered) {
        return base::Failure{mDay.dumps[apart->second].name + ": no registration is also in " +
                             mDay.dumps[apart->first].name +
                             ", and without dates the two cannot be put in order: merge captures "
                             "that say when they were taken"};
    }
    mDay.dating = dateLines(mDay.joined, taken);
    for (const size_t line : mDay.joined.gaps) {
        warn(mDay.joined.lines[line], "registrations are missing from " + printedTime(line - 1) +
                                              " to " + printedTime(line));
    }
    for (const size_t line : mDay.dating.setBack) {
        warn(mDay.joined.lines[line],
             "the clock was set back; the time of the line before it stands");
    }
    return std::nullopt;
}

void TraceBuilder::readUses() {
    mDay.parts = partsOf(mDay.joined, mDay.dumps);
    for (const JoinedDump& dump : mDay.joined.dumps) {
        const KnownEnd end = knownEnd(mDay.dumps[dump.dump].dump, mDay.dating, dump.last);
        if (end.at >= mDay.knownEnd.at) mDay.knownEnd = end;
        mDay.sensors.takeMissing(mDay.dumps[dump.dump].dump.service.sensors);
    }
    mDay.clients = ClientTable(mDay.dumps, mDay.joined, mDay.parts);
    mDay.levels = levelsOf(mDay.joined, mDay.parts, mDay.clients);
    mDay.steps = useSteps({mDay.joined, mDay.parts, mDay.clients, mDay.levels, mDay.dating,
                           allFirings(mDay.parts, mDay.dating)},
                          mDay.start, mDay.knownEnd.at);
}

void TraceBuilder::readStates() {
    for (const JoinedDump& joined : mDay.joined.dumps) {
        const NamedDump& dump = mDay.dumps[joined.dump];
        const StateCourse course = statesOf(dump);
        if (!dump.dump.taken()) continue;
        mDay.states.add(course,
                        mDay.dating.wallTime(knownEnd(dump.dump, mDay.dating, joined.last).at));
    }
    if (mDay.dating.firstDay)
        mDay.changes = changesFrom(mDay.dating.wallTime(mDay.start), mDay.states.finish());
}

StateCourse TraceBuilder::statesOf(const NamedDump& named) {
    const Dump& dump = named.dump;
    const BatteryHistory* history =
            dump.history && dump.history->hasLines() ? &*dump.history : nullptr;
    const EventLog* log = dump.log && dump.log->hasLines() ? &*dump.log : nullptr;
    if (history == nullptr && log == nullptr) return {};
    if (!dump.taken()) {
        warn(named.name, history != nullptr ? dump.historyStart : dump.logStart,
             "no display, charger, camera or calls: the capture does not say when it was taken");
        return {};
    }
    if (history != nullptr && !history->hasTimes()) {
        warn(named.name, dump.historyStart, "the battery history is left out: it has no TIME line");
        history = nullptr;
    }
    if (history != nullptr) warnOfRuns(named);
    return mergeSources(history, log);
}

void TraceBuilder::warnOfRuns(const NamedDump& dump) {
    int64_t count = 0;
    int64_t first = 0;
    const int64_t oldest = mDay.dating.wallTime(mDay.dating.times.front()) + kMsPerSecond;
    for (const SystemRun& run : dump.dump.history->systemRuns()) {
        if (run.at < oldest || mDay.states.isKnownUpTo(run.at)) continue;
        if (count++ == 0) first = run.lineNumber;
    }
    if (count == 0) return;
    warn(dump.name, first,
         "the system started or went down after the oldest registration (lines: " +
                 std::to_string(count) + ")");
}

void TraceBuilder::warnOfStrangers() {
    for (size_t i = 1; i < mDay.dumps.size(); ++i) {
        const bool sameSensors = haveSameSensors(mDay.dumps[0].dump, mDay.dumps[i].dump);
        if (sameSensors && haveSameBuild(mDay.dumps[0].dump, mDay.dumps[i].dump)) continue;
        warn(mDay.dumps[i].name, 1,
             std::string(sameSensors ? "another build of the system" : "other sensors") +
                     " than in " + mDay.dumps[0].name + ": are they captures of one device?");
    }
}

void TraceBuilder::warnOfLeftOut() {
    int64_t count = 0;
    const DumpLine* first = nullptr;
    for (size_t line = 0; line < mDay.joined.lines.size(); ++line) {
        if (mDay.clients.ofLine(line)) continue;
        if (count++ == 0) first = &mDay.joined.lines[line];
    }
    if (count == 0) return;
    warn(*first,
         std::to_string(count) + " registrations left out: their sensors are not in the list");
}

std::string TraceBuilder::printedTime(size_t line) const {
    const int64_t time = mDay.dating.times[line];
    return mDay.dating.firstDay ? base::formatStamp(mDay.dating.wallTime(time))
                                : base::formatTimeOfDay(std::chrono::milliseconds(time));
}

void TraceBuilder::warn(const std::string& file, int64_t lineNumber, const std::string& text) {
    mDay.warnings.push_back(base::at(file, lineNumber) + "warning: " + text);
}

void TraceBuilder::warn(const DumpLine& line, const std::string& text) {
    warn(mDay.dumps[line.dump].name, line.registration.lineNumber, text);
}

}  // namespace capture
