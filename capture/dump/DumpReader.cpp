#include "capture/dump/DumpReader.h"

#include <algorithm>
#include <array>
#include <utility>

#include "capture/dump/WallTime.h"
#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr std::string_view kReport = "== dumpstate";
constexpr std::string_view kService = "DUMP OF SERVICE ";
constexpr std::string_view kReportSection = "------ ";

/** Newer reports put a priority before a service's name. */
std::string_view serviceName(std::string_view text) {
    takePrefix(&text, "CRITICAL ") || takePrefix(&text, "HIGH ");
    return endsWith(text, ":") ? text.substr(0, text.size() - 1) : "";
}

bool isFooter(std::string_view text) {
    return startsWith(text, "-----") &&
           text.find("was the duration of dumpsys ") != std::string_view::npos;
}

}  // namespace

/** Where a section's heading may stand. */
enum class Place {
    kHead,     // before the first service
    kReport,   // at the start of a line of its own in the report
    kBattery,  // in the battery service's text, at the start of a line
    kSensors,  // in the sensor service's text, before the first registration
};

struct Section {
    Place place;

    /** Makes the section's reader ready if `text` is its heading; false if it is none. */
    bool (*begin)(std::string_view text, int64_t lineNumber, Dump* dump);

    /** Takes a line, without blanks around it; false if it ends the section. */
    bool (*take)(std::string_view text, int64_t lineNumber, Dump* dump);
};

namespace {

/** `text` is a heading that only captures have. */
bool provesService(bool isHeading, Dump* dump) {
    if (isHeading) dump->isCapture = dump->hasService = true;
    return isHeading;
}

bool takeNothing(std::string_view /*text*/, int64_t /*lineNumber*/, Dump* /*dump*/) {
    return true;
}

bool beginBuild(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!dump->build.empty() || !takePrefix(&text, "Build fingerprint: ")) return false;
    dump->build = text;
    return true;
}

// Of several logs and histories the first with lines counts.

bool beginLog(std::string_view text, int64_t lineNumber, Dump* dump) {
    if (!startsWith(text, "------ EVENT LOG (") || (dump->log && dump->log->hasLines())) {
        return false;
    }
    dump->isCapture = true;
    dump->log.emplace(dump->header);
    dump->logStart = lineNumber;
    return true;
}

bool takeLog(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    dump->log->takeLine(text);
    return true;
}

bool beginStatistics(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    return startsWith(text, "------ CHECKIN BATTERYSTATS (") && !dump->statistics.hasLines();
}

bool takeStatistics(std::string_view text, int64_t lineNumber, Dump* dump) {
    dump->statistics.takeLine(text, lineNumber);
    return true;
}

/** "Battery History (43% used, ...):", or with "[Format: 2] " before the bracket. */
bool beginHistory(std::string_view text, int64_t lineNumber, Dump* dump) {
    if (!takePrefix(&text, "Battery History ") || !endsWith(text, ":")) return false;
    const bool isLocal = takePrefix(&text, "[Format: 2] ");
    if (!startsWith(text, "(") || (dump->history && dump->history->hasLines())) return false;
    dump->isCapture = true;
    dump->history.emplace(isLocal ? HistoryFormat::kLocalTime : HistoryFormat::kSinceStart,
                          dump->header);
    dump->historyStart = lineNumber;
    return true;
}

bool takeHistory(std::string_view text, int64_t lineNumber, Dump* dump) {
    if (text.empty()) return false;
    dump->history->takeLine(text, lineNumber);
    return true;
}

bool beginNoSensors(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!provesService(startsWith(text, "No Sensors on the device"), dump)) return false;
    dump->hasNoSensors = true;
    return true;
}

bool beginCapturedAt(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    std::array<int, 3> fields;
    if (!takePrefix(&text, "Captured at: ") || !readFields(text, "##:##:##", fields.data())) {
        return false;
    }
    if (!dump->service.capturedAt) {
        dump->service.capturedAt = base::timeOfDay(fields[0], fields[1], fields[2]);
    }
    return true;
}

bool beginSensors(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!provesService(text == "Sensor List:", dump)) return false;
    dump->service.sensors = {};
    return true;
}

/** Hands a line to a reader of the sensor service's text. */
template <auto kReader>
bool takeBy(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    (dump->service.*kReader).takeLine(text);
    return true;
}

bool beginDevice(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!provesService(text == "Sensor Device:", dump)) return false;
    dump->service.device = {};
    return true;
}

bool beginEvents(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!provesService(text == "Recent Sensor events:", dump)) return false;
    dump->service.events = {};
    return true;
}

bool beginConnections(std::string_view text, int64_t lineNumber, Dump* dump) {
    if (!endsWith(text, " connections")) return false;
    auto count = parseCount(text, "active connections");
    if (!count) count = parseCount(text, "open event connections");
    if (count) dump->service.connections.emplace(*count, lineNumber);
    return count.has_value();
}

bool takeConnections(std::string_view text, int64_t lineNumber, Dump* dump) {
    dump->service.connections->takeLine(text, lineNumber);
    return true;
}

bool beginDirect(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!endsWith(text, " connections") ||
        !(parseCount(text, "direct connections") || parseCount(text, "open direct connections"))) {
        return false;
    }
    dump->service.direct = {};
    return true;
}

bool takeDirect(std::string_view text, int64_t lineNumber, Dump* dump) {
    dump->service.direct.takeLine(text, lineNumber);
    return true;
}

// The list gets every line of the service, as it must see what looks like a registration elsewhere.
bool beginRegistrations(std::string_view text, int64_t /*lineNumber*/, Dump* dump) {
    if (!provesService(startsWith(text, "Previous Registrations:"), dump)) return false;
    dump->registrations.begin();
    return true;
}

/** Every section that is read. A new one is a row here and a reader. */
constexpr Section kSections[] = {
        {Place::kHead, beginBuild, takeNothing},
        {Place::kReport, beginLog, takeLog},
        {Place::kReport, beginStatistics, takeStatistics},
        {Place::kBattery, beginHistory, takeHistory},
        {Place::kSensors, beginCapturedAt, takeBy<&SensorService::sensors>},
        {Place::kSensors, beginNoSensors, takeNothing},
        {Place::kSensors, beginSensors, takeBy<&SensorService::sensors>},
        {Place::kSensors, beginDevice, takeBy<&SensorService::device>},
        {Place::kSensors, beginEvents, takeBy<&SensorService::events>},
        {Place::kSensors, beginConnections, takeConnections},
        {Place::kSensors, beginDirect, takeDirect},
        {Place::kSensors, beginRegistrations, takeNothing},
};

/** The list of sensors of a text that has lost its headings. */
constexpr Section kBareSensors = {Place::kSensors, nullptr, takeBy<&SensorService::sensors>};

}  // namespace

DumpReader::DumpReader() : mSection(&kBareSensors) {}

void DumpReader::takeLine(std::string_view line, int64_t lineNumber) {
    std::string_view text = unquoted(line);
    if (startsWith(text, kReport)) {
        startReport(text.substr(kReport.size()));
    } else if (takePrefix(&text, kService)) {
        startService(serviceName(text));
    } else if (startsWith(text, kReportSection)) {
        mSection = nullptr;
        mDump.registrations.takeLine(text, lineNumber);
        startSection(text, lineNumber);
    } else if (mSection != nullptr && mSection->place == Place::kReport) {
        mSection->take(text, lineNumber, &mDump);  // logs quote anything, headings and footers, too
    } else if (isFooter(text)) {
        endService(text);
    } else if (mSection != nullptr && mSection->place == Place::kBattery) {
        if (!mSection->take(trimmed(text), lineNumber, &mDump)) mSection = nullptr;
    } else if (mService != Service::kOther) {
        takeServiceLine(text, lineNumber);
    }
}

Dump DumpReader::finish() {
    if (const auto taken = mDump.header ? mDump.header : mDump.service.footer) {
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
    mSection = nullptr;
    mService = name == "sensorservice"  ? Service::kSensors
               : name == "batterystats" ? Service::kBattery
                                        : Service::kOther;
    mDump.registrations.end();
    if (mService != Service::kSensors) return;
    mDump.hasService = true;
    mDump.registrations.repeat();
    mTakesFooter = mDump.registrations.empty();
    if (!mTakesFooter) return;
    mSection = &kBareSensors;
    mDump.service = {};
}

void DumpReader::endService(std::string_view text) {
    mSection = nullptr;
    if (isSensors() && text.find(" dumpsys sensorservice") != std::string_view::npos) {
        mDump.registrations.end();
        if (const auto stamp = valueOf(text, "ending at: "); stamp && mTakesFooter) {
            mDump.service.footer = parseStamp(*stamp);
        }
    }
    mService = Service::kUnknown;
}

void DumpReader::takeServiceLine(std::string_view text, int64_t lineNumber) {
    if (isSensors()) mDump.registrations.takeLine(trimmed(text), lineNumber);
    if (startSection(text, lineNumber) || !isSensors() || mSection == nullptr) return;
    mSection->take(trimmed(text), lineNumber, &mDump);
}

bool DumpReader::startSection(std::string_view text, int64_t lineNumber) {
    const bool isReport = startsWith(text, kReportSection);
    const std::string_view indented = trimmed(text);
    for (const Section& section : kSections) {
        if (isReport != (section.place == Place::kReport) || !mayBegin(section)) continue;
        const bool mayIndent = section.place == Place::kSensors;
        if (!section.begin(mayIndent ? indented : text, lineNumber, &mDump)) continue;
        if (section.place != Place::kHead) mSection = &section;
        return true;
    }
    return false;
}

bool DumpReader::mayBegin(const Section& section) const {
    if (mIsDone) return false;
    switch (section.place) {
        case Place::kHead:
            return mService == Service::kUnknown && mDump.header;
        case Place::kReport:
            return true;
        case Place::kBattery:
            return mService == Service::kUnknown || mService == Service::kBattery;
        case Place::kSensors:
            return isSensors() && mDump.registrations.empty();
    }
    return false;
}

}  // namespace capture
