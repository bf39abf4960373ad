#include "capture/DumpReader.h"

#include <utility>

#include "capture/CaptureText.h"
#include "capture/WallTime.h"

namespace capture {

namespace {

constexpr std::string_view kReport = "== dumpstate";
constexpr std::string_view kService = "DUMP OF SERVICE ";
constexpr std::string_view kSection = "------ ";
constexpr std::string_view kLog = "------ EVENT LOG (";
constexpr std::string_view kHistory = "Battery History ";

/** Newer reports put a priority before a service's name. */
std::string_view serviceName(std::string_view text) {
    takePrefix(&text, "CRITICAL ") || takePrefix(&text, "HIGH ");
    return endsWith(text, ":") ? text.substr(0, text.size() - 1) : "";
}

bool isFooter(std::string_view text) {
    return startsWith(text, "-----") &&
           text.find("was the duration of dumpsys ") != std::string_view::npos;
}

/** "Battery History (43% used, ...):", or with "[Format: 2] " before the bracket. */
std::optional<HistoryFormat> historyFormat(std::string_view text) {
    if (!takePrefix(&text, kHistory) || !endsWith(text, ":")) return std::nullopt;
    const bool isLocal = takePrefix(&text, "[Format: 2] ");
    if (!startsWith(text, "(")) return std::nullopt;
    return isLocal ? HistoryFormat::kLocalTime : HistoryFormat::kSinceStart;
}

}  // namespace

void DumpReader::line(std::string_view line, int64_t lineNumber) {
    std::string_view text = unquoted(line);
    if (startsWith(text, kReport)) {
        startReport(text.substr(kReport.size()));
    } else if (takePrefix(&text, kService)) {
        startService(serviceName(text));
    } else if (startsWith(text, kSection)) {
        startSection(text, lineNumber);
    } else if (mInLog) {
        mDump.log->line(text);
    } else if (mInHistory) {
        historyLine(trimmed(text), lineNumber);
    } else {
        serviceLine(text, lineNumber);
    }
}

Dump DumpReader::finish() {
    if (const auto taken = mDump.header ? mDump.header : mDump.footer) {
        if (mDump.log) mDump.log->finish(*taken);
        if (mDump.history) mDump.history->finish(*taken);
    }
    return std::move(mDump);
}

void DumpReader::startReport(std::string_view text) {
    mDump.isCapture = true;
    const auto stamp = takePrefix(&text, ": ") ? parseStamp(text) : std::nullopt;
    if (!stamp) return;  // the last line of a report, for instance
    if (!mDump.registrations.empty()) {
        mIsDone = true;
        mDump.registrations.end();
    } else if (mDump.header) {
        *this = DumpReader();
        mDump.isCapture = true;
    }
    if (!mDump.header) mDump.header = stamp;
}

void DumpReader::startService(std::string_view name) {
    mDump.isCapture = true;
    mInLog = mInHistory = false;
    mTakesSensors = name == "sensorservice";
    mTakesHistory = name == "batterystats";
    mDump.registrations.end();
    if (!mTakesSensors) return;
    mDump.hasService = true;
    mDump.registrations.repeat();
    mTakesFooter = mDump.registrations.empty();
    if (!mTakesFooter) return;
    mInList = true;
    mDump.sensors = {};
    mDump.footer.reset();
}

void DumpReader::endService(std::string_view text) {
    const bool isSensors = text.find(" dumpsys sensorservice") != std::string_view::npos;
    mTakesHistory = true;
    if (!isSensors || !mTakesSensors) return;
    mDump.registrations.end();
    if (const auto stamp = valueOf(text, "ending at: "); stamp && mTakesFooter) {
        mDump.footer = parseStamp(*stamp);
    }
}

void DumpReader::startSection(std::string_view text, int64_t lineNumber) {
    mInLog = mInHistory = false;
    mDump.registrations.line(text, lineNumber);
    if (!startsWith(text, kLog) || mIsDone || (mDump.log && mDump.log->hasLines())) return;
    mDump.isCapture = mInLog = true;
    mDump.log.emplace(mDump.header);
    mDump.logStart = lineNumber;
}

void DumpReader::startHistory(std::string_view text, int64_t lineNumber) {
    const auto format = historyFormat(text);
    if (!format || mIsDone || (mDump.history && mDump.history->hasLines())) return;
    mDump.isCapture = mInHistory = true;
    mDump.history.emplace(*format, mDump.header);
    mDump.historyStart = lineNumber;
}

void DumpReader::historyLine(std::string_view text, int64_t lineNumber) {
    mInHistory = !text.empty() && !isFooter(text);
    if (mInHistory) mDump.history->line(text, lineNumber);
    if (isFooter(text)) endService(text);
}

void DumpReader::serviceLine(std::string_view text, int64_t lineNumber) {
    if (isFooter(text)) {
        endService(text);
    } else if (mTakesHistory && startsWith(text, kHistory)) {
        startHistory(text, lineNumber);
    } else if (mTakesSensors) {
        sensorLine(trimmed(text), lineNumber);
    }
}

void DumpReader::sensorLine(std::string_view text, int64_t lineNumber) {
    if (text == "Sensor List:" || text == "Sensor Device:") {
        mDump.isCapture = mDump.hasService = true;
        mInList = mDump.registrations.empty();
        mDump.registrations.line(text, lineNumber);
    } else if (startsWith(text, "No Sensors on the device")) {
        mDump.isCapture = mDump.hasService = mDump.hasNoSensors = true;
    } else if (startsWith(text, "Previous Registrations:")) {
        mDump.isCapture = mDump.hasService = true;
        mInList = false;
        mDump.registrations.begin();
    } else if (mInList) {
        mDump.sensors.line(text);
    } else {
        mDump.registrations.line(text, lineNumber);
    }
}

}  // namespace capture
