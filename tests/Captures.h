#pragma once

#include <string>
#include <vector>

#include "trace/Note.h"

/** A trace made of captures, or why there is none. */
struct Imported {
    std::string trace;
    std::vector<std::string> warnings;
    std::string error;  // empty: there is none
};

/** Imports captures of one device, named 0, 1, ... */
Imported importTexts(const std::vector<std::string>& texts);

/** Imports one capture, named "capture". */
Imported importText(const std::string& text);

/** The lines of `text` that hold `part`. */
std::vector<std::string> linesWith(const std::string& part, const std::string& text);

/** The calls of `trace` that hold `part`, but for those before the oldest line; without notes. */
std::vector<std::string> callsWith(const std::string& part, const std::string& trace);

/** The note of the line of `trace` that holds `part` first, read. */
trace::Note noteWith(const std::string& part, const std::string& trace);

/**
 * What a reader of the trace sees that follows its calls and notes by their rules, one JSON object
 * a line: the enables "before", each "use" in the order of their ends, "sinceCharge".
 */
std::vector<std::string> usesOf(const std::string& trace);

/** The uses in short: "a@1 0: 36000-39600 off x2 20000us", seconds; "<" stands before earlier ones.
 */
std::string shortUsesOf(const std::string& trace);

/**
 * The state calls of a trace in short: "09:59:50 d1, 10:00:00 p2 c1 t0" are the display, the plug,
 * the camera and a (telephone) call. Days after the first stand as "+1 " before the time.
 */
std::string statesOf(const std::string& trace);

/** A list of sensors: handle 0 of type 1, handle 0x5f636779 of type 65537. */
extern const std::string kSensors;

/**
 * A bug report of which one registration was made at 10:00:00 on 2024-05-02, and which was taken at
 * 12:00:00: the trace starts at 09:59:50. `history` stands under a battery history's heading, `log`
 * under the event log's.
 */
std::string bugReport(const std::string& history, const std::string& log);
