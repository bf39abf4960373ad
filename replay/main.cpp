#include <iostream>

#include <CLI/CLI.hpp>

#include "replay/Player.h"
#include "replay/Replay.h"

namespace {

constexpr char kExamples[] = R"(Examples:
  sensor-replay capture.txt              play a device's day and print what it reports
  sensor-replay --json day.jsonl         the same of a trace, one JSON object per line
  sensor-replay --print-trace capture.txt > day.jsonl
                                         make a trace of a capture, to read and to edit
  adb shell dumpsys sensorservice | sensor-replay -
                                         play the device on the desk
  sensor-replay --properties device.db monday.jsonl tuesday.jsonl
                                         two days, a device boot between them, on stored counters

Plays recorded days through libsensor-priv on a virtual clock: a trace (JSON Lines), or a device
capture (the text of `dumpsys sensorservice`, or a bug report that holds it), which is recognised
by its content.
)";

constexpr char kStatuses[] = R"(Exit status:
  0  everything was played
  1  the tool or the library failed
  2  an argument, a line, a capture or the property file is wrong; what came before it is done)";

}  // namespace

int main(int argc, char** argv) {
    replay::Options options;
    bool json = false;
    CLI::App app(kExamples, "sensor-replay");
    app.footer(kStatuses);
    app.add_flag("--json", json, "print JSON Lines");
    app.add_flag("--print-trace", options.printTrace,
                 "print the trace made from a capture instead of playing it");
    app.add_option("--properties", options.properties,
                   "keep the system properties in FILE (made if missing)")
            ->type_name("FILE");
    app.add_option("FILE", options.files, "traces and captures; - is standard input")->required();
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        const int status = app.exit(error) == 0 ? 0 : replay::kStatusBadInput;
        return std::cout.flush() ? status : replay::kStatusFailed;
    }
    if (json) options.format = report::OutputFormat::kJson;
    return replay::replayFiles(options);
}
