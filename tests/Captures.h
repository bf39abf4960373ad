#pragma once

#include <string>
#include <vector>

#include "capture/ImportedCapture.h"

/** Imports captures of one device, named 0, 1, ... */
capture::ImportedCapture importTexts(const std::vector<std::string>& texts);

/** Imports one capture, named "capture". */
capture::ImportedCapture importText(const std::string& text);

/** The lines of `text` that hold `part`. */
std::vector<std::string> linesWith(const std::string& part, const std::string& text);

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
std::string report(const std::string& history, const std::string& log);
