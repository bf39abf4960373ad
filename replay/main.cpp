#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <thread>

#include <unistd.h>
#include <CLI/CLI.hpp>

#include "replay/Replay.h"
#include "trace/CallTable.h"
#include "trace/Failure.h"

namespace {

constexpr char kExamples[] = R"(Examples:
  sensor-replay capture.txt              play a device's day and print what it reports
  sensor-replay --json day.jsonl         the same of a trace, one JSON object per line
  sensor-replay --print-trace capture.txt > day.jsonl
                                         make a trace of a capture, to read and to edit
  adb shell dumpsys sensorservice | sensor-replay -
                                         play the device on the desk
  sensor-replay --merge morning.zip noon.zip evening.zip
                                         one day of several bug reports of a device
  sensor-replay --properties device.db monday.jsonl tuesday.jsonl
                                         two days, a device boot between them, on stored counters

Plays recorded days through libsensor-priv on a virtual clock: a trace (JSON Lines), or a device
capture (the text of `dumpsys sensorservice`, or a bug report that holds it, also zipped, as gzip
or as UTF-16), which is recognised by its content.
)";

constexpr char kStatuses[] = R"(Exit status:
  0  everything was played
  1  the tool or the library failed
  2  an argument, a line, a capture or the property file is wrong; what came before it is done
  3  --check: the replay differs from what the trace expects)";

}  // namespace

int main(int argc, char** argv) {
    replay::Options options;
    options.jobs = static_cast<int>(std::max(1U, std::thread::hardware_concurrency()));
    CLI::App app(kExamples, "sensor-replay");
    app.footer(kStatuses);
    app.set_version_flag("--version", "sensor-replay " SENSOR_REPLAY_VERSION,
                         "print the version and exit");
    auto* log = app.add_flag("--log", options.log, "print what happens, a line each, as it comes");
    auto* json =
            app.add_flag("--json", options.json, "print the same as JSON Lines")->excludes(log);
    app.add_flag("--all", options.all, "show all rows of the summary's tables, not the first 20");
    auto* printTrace = app.add_flag("--print-trace", options.printTrace,
                                    "print the trace made from a capture instead of playing it");
    app.add_flag("--check", options.check,
                 R"(compare what the library does with the trace's "expect" lines)")
            ->excludes(json)
            ->excludes(log)
            ->excludes(printTrace);
    app.add_flag("--merge", options.merge,
                 "make one day of several captures of one device, taken one after another");
    app.add_option("--jobs", options.jobs, "captures that are played at once (default: all cores)")
            ->type_name("N")
            ->check(CLI::PositiveNumber);
    app.add_option("--properties", options.properties,
                   "keep the system properties in FILE (made if missing)")
            ->type_name("FILE");
    app.add_option("--timeline", options.timeline,
                   "write the day of one input as trace events to FILE, for a timeline viewer")
            ->type_name("FILE")
            ->excludes(printTrace);
    app.add_option("--page", options.page, "write the summary of one input as an HTML page to FILE")
            ->type_name("FILE")
            ->excludes(printTrace);
    bool listCalls = false;
    app.add_flag("--list-calls", listCalls, "list the calls that a trace can make, and exit");
    app.add_option("FILE", options.files, "traces and captures; - is standard input");
    try {
        app.parse(argc, argv);
        if (options.files.empty() && !listCalls) throw CLI::RequiredError("FILE");
        if (options.inputs() > 1 && (options.timeline || options.page)) {
            throw CLI::ValidationError(options.timeline ? "--timeline" : "--page",
                                       "takes one input");
        }
    } catch (const CLI::ParseError& error) {
        const int status = app.exit(error) == 0 ? 0 : trace::kStatusBadInput;
        return std::cout.flush() ? status : trace::kStatusFailed;
    }
    if (listCalls) {
        return std::cout << trace::listCalls() << std::flush ? 0 : trace::kStatusFailed;
    }
    const char* noColour = std::getenv("NO_COLOR");
    options.colours = isatty(STDOUT_FILENO) != 0 && (noColour == nullptr || *noColour == '\0');
    return replay::replayFiles(options);
}
