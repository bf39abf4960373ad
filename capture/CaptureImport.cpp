#include "capture/CaptureImport.h"

#include <cstdint>
#include <utility>

#include "capture/TraceBuilder.h"
#include "capture/dump/DumpReader.h"

namespace capture {

namespace {

/** What keeps a capture from being a trace; empty if nothing does. */
std::string missing(const Dump& dump) {
    const RegistrationList& list = dump.registrations;
    if (!dump.hasService) return "no sensor service in the bug report";
    if (!list.empty()) return "";
    if (dump.hasNoSensors && dump.service.sensors.sensors().empty()) {
        return "no sensors on the device, so no registrations";
    }
    const SkippedLines& lines = list.unreadable().count > 0 ? list.unreadable() : list.unknown();
    if (lines.count > 0) {
        return "no previous registrations that can be read: " +
               lines.naming("lines of an unknown form");
    }
    return list.refused().empty() ? "no previous registrations"
                                  : "no previous registrations that were not refused";
}

/** Tells of all that a dump holds but nothing can be made of. */
void warnOfLost(const std::string& name, const Dump& dump, std::vector<std::string>* warnings) {
    const auto warn = [&](int64_t lineNumber, const std::string& text) {
        warnings->push_back(base::at(name, lineNumber) + "warning: " + text);
    };
    const auto warnOf = [&](const SkippedLines& lines, const std::string& what) {
        if (lines.count > 0) warn(lines.firstNumber, lines.naming(what));
    };
    const RegistrationList& list = dump.registrations;
    warnOf(list.unreadable(), "registrations left out: they cannot be read");
    warnOf(list.behind(), "registrations left out: they stand behind the end of their section");
    if (const auto& connections = dump.service.connections) {
        warnOf(connections->unreadable(), "lines of connections left out: they cannot be read");
        if (connections->found() != connections->announced()) {
            warn(connections->lineNumber(),
                 "not all connections are there: " + std::to_string(connections->found()) + " of " +
                         std::to_string(connections->announced()));
        }
    }
    warnOf(dump.service.direct.unreadable(),
           "lines of direct connections left out: they cannot be read");
    warnOf(dump.statistics.unreadable(),
           "lines of the battery statistics left out: they cannot be read");
}

}  // namespace

void CaptureImport::add(const std::string& name, std::string_view firstLine,
                        base::LineReader* reader) {
    if (mFailure) return;
    DumpReader dumpReader;
    const int64_t firstNumber = reader->lineNumber();
    dumpReader.takeLine(firstLine, firstNumber);
    while (const auto line = reader->next()) dumpReader.takeLine(*line, reader->lineNumber());
    Dump dump = dumpReader.finish();
    if (reader->error()) {
        mFailure = base::Failure{base::at(name, reader->lineNumber()) + *reader->error()};
    } else if (!dump.isCapture) {
        mFailure = base::Failure{base::at(name, firstNumber) +
                                 "neither a JSON object nor part of a device capture"};
    } else if (const std::string what = missing(dump); !what.empty()) {
        mMissing.push_back({name, what});
    } else {
        warnOfLost(name, dump, &mWarnings);
        mDumps.push_back({name, std::move(dump)});
    }
}

base::Result<ImportedCapture> CaptureImport::finish() {
    if (mFailure) return tl::unexpected(*mFailure);
    if (mDumps.empty()) {
        if (mMissing.empty()) return ImportedCapture{};
        return base::fail(mMissing.front().name + ": " + mMissing.front().what);
    }
    for (const Missing& missing : mMissing) {
        mWarnings.push_back(base::at(missing.name, 1) + "warning: left out: " + missing.what);
    }
    return TraceBuilder(std::move(mDumps), std::move(mWarnings)).build();
}

}  // namespace capture
