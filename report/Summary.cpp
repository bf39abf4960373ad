#include "report/Summary.h"

#include <algorithm>
#include <cstdio>
#include <limits>
#include <set>
#include <utility>

#include <time.h>

#include "report/Table.h"
#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kShownRows = 20;
constexpr int32_t kReportHour = 23;
constexpr int64_t kNsPerMs = 1'000'000;

/** The time that passes outside of the replay, whose monotonic clock is virtual. */
int64_t realTime() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC_RAW, &now);
    return int64_t{now.tv_sec} * 1'000'000'000 + now.tv_nsec;
}

std::string count(int64_t number, const std::string& noun) {
    return std::to_string(number) + ' ' + noun + (number == 1 ? "" : "s");
}

/** A moment of the trace, in ms, with its date if `origin` knows that of the first day. */
std::string formatMoment(int64_t ms, const trace::Origin& origin) {
    const int64_t ns = ms * kNsPerMs;
    const int64_t day = ns / kNsPerDay;
    const std::string time = formatTimeOfDay(ns);
    if (origin.firstDay) return formatDate(*origin.firstDay + day) + ' ' + time;
    return "day " + std::to_string(day + 1) + ' ' + time;
}

std::string describeKnown(const char* what, const std::vector<trace::Interval>& known,
                          const trace::Origin& origin) {
    std::string text = std::string("  ") + what + ' ';
    if (known.empty()) return text + "unknown\n";
    std::string spans;
    for (const trace::Interval& each : known) {
        spans += (spans.empty() ? "known from " : ", ") + formatMoment(each.from, origin) + " to " +
                 formatMoment(each.to, origin);
    }
    return text + spans + '\n';
}

}  // namespace

Summary::Summary(Stdout* out, bool showsAll, bool hasColours)
      : mOut(out),
        mLimit(showsAll ? std::numeric_limits<size_t>::max() : kShownRows),
        mHasColours(hasColours),
        mUsage([this](const Slice& slice) {
            mDays.add(mBoot, slice, mUsage);
            mSlices.push_back({mBoot, slice});
        }) {}

void Summary::begin(const Input& input) {
    mInput = input;
    mDays = {};
    mSlices.clear();
    mReports.clear();
    mEvents.clear();
    mProperties.clear();
    mBoot = -1;
    mPlayed = 0;
    mStarted = realTime();
}

void Summary::take(const Record& record) {
    const auto& [first, second, third] = record.texts;
    switch (record.kind) {
        case Record::Kind::kBoot:
            takeBoot(record);
            break;
        case Record::Kind::kCall:
            takeCall(record);
            break;
        case Record::Kind::kEvent:
            mEvents.push_back({mBoot, {record.at, std::string(second), takeApart(second, third)}});
            break;
        case Record::Kind::kProperty:
            mProperties[std::string(first)] = second;
            break;
        default:
            break;
    }
    mAt = record.at;
}

void Summary::takeBoot(const Record& record) {
    endBoot();
    ++mBoot;
    mBootAt = record.at;
}

void Summary::takeCall(const Record& record) {
    static const auto kClock = trace::findCall("SDCImpl.notifySdcClock");
    const trace::Call& call = mCalls.read(record);
    mUsage.call(record.at, call);
    if (call.index == kClock && std::get<int32_t>(call.arguments[0]) == kReportHour) {
        mReports.push_back({mBoot, record.at});
    }
}

void Summary::endBoot() {
    if (mBoot < 0) return;
    mUsage.end(mAt);
    mPlayed += mAt - mBootAt;
}

void Summary::end(bool isWhole) {
    if (!isWhole && mBoot < 0) return;
    endBoot();
    printOrigin();
    printDays();
    printReasons();
    printProperties();
    printEnd(isWhole);
}

void Summary::printOrigin() {
    mOut->write(heading(cut(safe(mInput.name), kWidth)));
    if (mInput.origin != nullptr) {
        const trace::Origin& origin = *mInput.origin;
        if (origin.taken) mOut->write("  taken " + safe(*origin.taken) + '\n');
        mOut->write("  " + count(origin.registrationCount, "registration") + " from " +
                    formatMoment(origin.registrations.from, origin) + " to " +
                    formatMoment(origin.registrations.to, origin) + '\n');
        mOut->write(describeKnown("display", origin.displayKnown, origin));
        mOut->write(describeKnown("charger", origin.chargeKnown, origin));
    }
    for (const std::string& warning : mInput.warnings)
        mOut->write("  " + cut(safe(warning), kWidth - 2) + '\n');
}

void Summary::printDays() {
    std::set<Day> days;
    for (const Day& day : mDays.days()) days.insert(day);
    for (const auto& [boot, event] : mEvents) days.insert({boot, event.at / kNsPerDay});
    for (const Day& day : days) printDay(day);
}

void Summary::printDay(const Day& day) {
    mOut->write('\n' + heading(nameDay(day)));
    const std::vector<DayUse> uses = mDays.usesOf(day);
    if (!uses.empty()) mOut->write(layOut(uses, mInput.origin, mLimit));
    std::string reports;
    for (const auto& [boot, event] : mEvents) {
        if (boot == day.boot && event.at / kNsPerDay == day.number) {
            reports += layOut(event, mLimit);
        }
    }
    mOut->write(reports.empty() ? "\nThe device reports nothing.\n"
                                : "\nThe device reports:\n" + reports);
}

void Summary::printReasons() {
    const auto reasons = explainDifferences(mSlices, mReports, mInput.origin);
    if (reasons.empty()) return;
    mOut->write('\n' + heading("Why times held and times reported differ"));
    for (const auto& [text, names] : reasons) {
        mOut->write("  " + text + ":\n");
        const size_t shown = std::min(names.size(), mLimit);
        for (size_t i = 0; i < shown; ++i) {
            mOut->write("    " + cut(safe(names[i]), kWidth - 4) + '\n');
        }
        if (shown < names.size())
            mOut->write("    and " + std::to_string(names.size() - shown) + " more\n");
    }
}

void Summary::printProperties() {
    if (mProperties.empty()) return;
    mOut->write('\n' + heading("Stored at the end"));
    mOut->write(layOutProperties(mProperties));
}

void Summary::printEnd(bool isWhole) {
    char seconds[32];
    std::snprintf(seconds, sizeof(seconds), "%.3f",
                  static_cast<double>(realTime() - mStarted) / 1e9);
    mOut->write(std::string(isWhole ? "\nPlayed " : "\nStopped after ") + count(mBoot + 1, "boot") +
                ", " + formatDuration(mPlayed) + " of the device's time, in " + seconds +
                " s.\n\n");
}

std::string Summary::nameDay(const Day& day) const {
    if (mInput.origin != nullptr && mInput.origin->firstDay) {
        return formatDate(*mInput.origin->firstDay + day.number);
    }
    const std::string name = "Day " + std::to_string(day.number + 1);
    return mBoot == 0 ? name : "Boot " + std::to_string(day.boot + 1) + ", day " + name.substr(4);
}

std::string Summary::heading(const std::string& text) const {
    return mHasColours ? "\x1b[1m" + text + "\x1b[0m\n" : text + '\n';
}

}  // namespace report
