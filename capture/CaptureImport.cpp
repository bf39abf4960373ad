#include "capture/CaptureImport.h"

#include <algorithm>
#include <cstdint>
#include <utility>

#include "capture/DumpReader.h"
#include "capture/TraceBuilder.h"
#include "trace/Failure.h"
#include "trace/JsonText.h"

namespace capture {

namespace {

/** "2 lines ..., the first is "..."" */
std::string namingFirst(const SkippedLines& lines, const std::string& what) {
    return std::to_string(lines.count) + ' ' + what + ", the first is " +
           trace::toJson(lines.firstText);
}

/** What keeps a capture from being a trace; empty if nothing does. */
std::string missing(const Dump& dump) {
    const RegistrationList& list = dump.registrations;
    if (!dump.hasService) return "no sensor service in the bug report";
    if (!list.empty()) return "";
    if (dump.hasNoSensors && dump.sensors.sensors().empty()) {
        return "no sensors on the device, so no registrations";
    }
    const SkippedLines& lines = list.unreadable().count > 0 ? list.unreadable() : list.unknown();
    if (lines.count == 0) return "no previous registrations";
    return "no previous registrations that can be read: " +
           namingFirst(lines, "lines of an unknown form");
}

void warnOfSkipped(const std::string& name, const RegistrationList& list,
                   std::vector<std::string>* warnings) {
    const auto warn = [&](const SkippedLines& lines, const std::string& what) {
        if (lines.count == 0) return;
        warnings->push_back(trace::at(name, lines.firstNumber) +
                            "warning: " + namingFirst(lines, what));
    };
    warn(list.unreadable(), "registrations left out: they cannot be read");
    warn(list.behind(), "registrations left out: they stand behind the end of their section");
}

}  // namespace

void CaptureImport::add(const std::string& name, std::string_view firstLine,
                        trace::LineReader* reader) {
    if (!mError.empty()) return;
    DumpReader dumpReader;
    const int64_t firstNumber = reader->lineNumber();
    dumpReader.line(firstLine, firstNumber);
    while (const auto line = reader->next()) dumpReader.line(*line, reader->lineNumber());
    Dump dump = dumpReader.finish();
    if (reader->error()) {
        mError = trace::at(name, reader->lineNumber()) + *reader->error();
    } else if (!dump.isCapture) {
        mError =
                trace::at(name, firstNumber) + "neither a JSON object nor part of a device capture";
    } else if (const std::string what = missing(dump); !what.empty()) {
        mMissing.push_back({name, what});
    } else {
        warnOfSkipped(name, dump.registrations, &mWarnings);
        mSources.push_back({name, std::move(dump)});
    }
}

ImportedCapture CaptureImport::finish() {
    ImportedCapture result;
    result.error = mError;
    if (mError.empty() && mSources.empty() && !mMissing.empty()) {
        result.error = mMissing.front().name + ": " + mMissing.front().what;
    }
    if (!result.error.empty() || mSources.empty()) return result;
    for (const Missing& missing : mMissing) {
        mWarnings.push_back(trace::at(missing.name, 1) + "warning: left out: " + missing.what);
    }
    result.warnings = std::move(mWarnings);
    TraceBuilder(&mSources, &result).build();
    return result;
}

ImportedCapture importCapture(const std::string& name, std::string_view firstLine,
                              trace::LineReader* reader) {
    CaptureImport import;
    import.add(name, firstLine, reader);
    return import.finish();
}

}  // namespace capture
