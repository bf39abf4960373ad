#include "report/Csv.h"

#include <cstdio>
#include <utility>

#include "base/Calendar.h"
#include "base/Csv.h"
#include "base/FileIo.h"
#include "base/Json.h"
#include "day/Samples.h"
#include "report/Format.h"

namespace report {

namespace {

constexpr size_t kFlushSize = size_t{64} << 10;
constexpr int64_t kNsPerUs = 1000;

constexpr std::string_view kUses =
        "file,taken,day,app,client_tag,uid,sensor,type,mode,wake_up,handle,op_pkg,from,to,from_ms,"
        "to_ms,before,end,enables,period_us,hz,batch_ms,held_s,display_known_s,display_on_s,"
        "samples\r\n";
constexpr std::string_view kSinceCharge =
        "file,taken,uid,app,packages,handle,sensor,ms,count,background_ms,shared,on_battery_ms"
        "\r\n";

/** "2018-04-25T11:45:07" of "2018-04-25 11:45:07". */
std::string isoOf(std::string stamp) {
    if (const size_t blank = stamp.find(' '); blank != std::string::npos) stamp[blank] = 'T';
    return stamp;
}

/** A moment of the trace as local time; empty without a date. */
std::string isoOf(int64_t ns, const std::optional<int64_t>& firstDay) {
    if (!firstDay) return {};
    const int64_t ms = ns / base::kNsPerMs;
    std::string text = isoOf(base::formatStamp(*firstDay * base::kMsPerDay + ms));
    if (const int64_t rest = ns % base::kNsPerSecond; rest != 0) {
        // Milliseconds show a second as 1000, of which the digits behind the first are the
        // decimals.
        std::string decimals = base::formatMs(rest + base::kNsPerSecond).substr(1);
        decimals.erase(std::remove(decimals.begin(), decimals.end(), '.'), decimals.end());
        text += '.' + decimals;
    }
    return text;
}

std::string takenOf(const day::Notes& notes) {
    return notes.capture && notes.capture->taken ? isoOf(*notes.capture->taken) : "";
}

/** `amount` thousandths in units. */
std::string asDecimal(int64_t amount) {
    return base::formatMs(amount * (base::kNsPerMs / 1000));
}

std::string asDecimal(double number) {
    char text[48];
    std::snprintf(text, sizeof(text), "%.10g", number);
    return text;
}

template <typename T>
std::string ifKnown(const std::optional<T>& value) {
    return value ? std::to_string(*value) : std::string();
}

std::string flag(bool value) {
    return value ? "1" : "0";
}

/** Seconds with milliseconds. */
std::string seconds(int64_t ns) {
    return asDecimal(ns / base::kNsPerMs);
}

std::string firstOf(const std::vector<std::string>& packages) {
    return packages.empty() ? std::string() : packages.front();
}

}  // namespace

Csv::Csv(base::OutputFile* file, std::string_view header,
         std::function<void(const day::Use&)> takeUse)
      : mFile(file),
        mRows(header),
        mTracker(std::move(takeUse)) {
    flush();
}

void Csv::begin(const std::string& name) {
    mName = name;
    mTracker.begin();
}

void Csv::end(bool) {
    mTracker.end();
    flush();
}

void Csv::flushIfLarge() {
    if (mRows.size() >= kFlushSize) flush();
}

void Csv::flush() {
    const int fd = fileno(mFile->file());
    if (!mFailure && !base::writeAll(fd, mRows.data(), mRows.size())) mFailure = mFile->failure();
    mRows.clear();
}

UsesCsv::UsesCsv(base::OutputFile* file)
      : Csv(file, kUses, [this](const day::Use& use) { mEnded.add(use); }) {}

void UsesCsv::take(const trace::Record& record) {
    if (record.kind == trace::Record::Kind::kExpect) return;  // its time is the recorded device's
    tracker()->take(record);
    // A boot of the device forgets the notes that its uses need.
    const bool isOver = record.kind == trace::Record::Kind::kOver;
    for (const day::Use& use : mEnded.take(isOver ? day::EndedUses::kAll : record.at)) add(use);
}

void UsesCsv::add(const day::Use& use) {
    const std::optional<int64_t> firstDay = tracker()->notes().firstDay;
    const bool hasRate =
            use.periodNs && *use.periodNs > 0 && use.mode != trace::SensorMode::kOneShot;
    const auto samples = day::samplesOf(use);
    base::CsvWriter row(rows());
    row.field(name()).field(takenOf(tracker()->notes()));
    row.field(firstDay ? base::formatDate(*firstDay + use.from / base::kNsPerDay) : "");
    row.field(firstOf(use.packages)).field(use.pkg).field(ifKnown(use.uid));
    row.field(use.sensor).field(use.type).field(trace::nameOf(use.mode));
    row.field(use.wakeUp ? flag(*use.wakeUp) : "").field(ifKnown(use.handle)).field(use.opPkg);
    row.field(isoOf(use.from, firstDay)).field(isoOf(use.to, firstDay));
    row.field(base::formatMs(use.from)).field(base::formatMs(use.to));
    row.field(flag(use.before)).field(nameOf(use.end)).field(use.enables.size());
    row.field(use.periodNs ? base::formatMs(*use.periodNs * kNsPerUs) : "");
    row.field(hasRate ? asDecimal(1e9 / static_cast<double>(*use.periodNs)) : "");
    row.field(!use.batchUs ? "" : *use.batchUs < 0 ? "-1" : asDecimal(*use.batchUs));
    row.field(seconds(use.to - use.from)).field(seconds(use.display.known));
    row.field(use.display.known > 0 ? seconds(use.display.on) : "");
    row.field(samples ? asDecimal(*samples) : "");
    row.endRow();
    flushIfLarge();
}

SinceChargeCsv::SinceChargeCsv(base::OutputFile* file)
      : Csv(file, kSinceCharge, [](const day::Use&) {}) {}

void SinceChargeCsv::begin(const std::string& name) {
    Csv::begin(name);
    mIsAdded = false;
}

void SinceChargeCsv::take(const trace::Record& record) {
    tracker()->take(record);
    const day::Notes& notes = tracker()->notes();
    const bool hasStatistics = notes.taken && notes.taken->sinceCharge;
    if (hasStatistics && !mIsAdded) add(notes);
    mIsAdded = hasStatistics;
}

void SinceChargeCsv::add(const day::Notes& notes) {
    const trace::SinceCharge& charge = *notes.taken->sinceCharge;
    for (const trace::ChargeRow& each : charge.rows) {
        const auto& packages = notes.packagesOf(each.uid);
        base::CsvWriter row(rows());
        row.field(name()).field(takenOf(notes)).field(each.uid);
        row.field(firstOf(packages)).field(join(packages, " ")).field(each.handle);
        row.field(notes.nameOf(each)).field(each.ms).field(each.count);
        row.field(ifKnown(each.background)).field(flag(each.shared));
        row.field(ifKnown(charge.onBatteryMs));
        row.endRow();
        flushIfLarge();
    }
}

}  // namespace report
