#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include <CLI/CLI.hpp>
#include <fcntl.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include "base/Nearest.h"
#include "base/OutputFile.h"
#include "base/Result.h"
#include "replay/Outputs.h"
#include "replay/Replay.h"
#include "trace/CallTable.h"

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

/** The columns of the terminal on standard output; what is narrower breaks the lines itself. */
size_t terminalColumns() {
    constexpr size_t kLeast = 80;
    winsize size{};
    if (ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0) return kLeast;
    return std::max<size_t>(size.ws_col, kLeast);
}

/** Names the option that a misspelt one probably stands for. */
int refuseOption(const CLI::App& app, const CLI::ExtrasError& error) {
    std::vector<std::string> names;
    for (const CLI::Option* option : app.get_options()) {
        for (const std::string& name : option->get_lnames()) names.push_back("--" + name);
    }
    for (const std::string& given : app.remaining()) {
        if (given.substr(0, 1) != "-") continue;
        const std::string name = given.substr(0, given.find('='));
        std::cerr << "there is no option " << name << "; the nearest is "
                  << base::nearest(name, {names.begin(), names.end()}) << '\n';
        return base::kStatusBadInput;
    }
    std::cerr << error.what() << '\n';
    return base::kStatusBadInput;
}

/** The files of the command line, for which is written to which must be another one. */
std::vector<base::NamedFile> filesOf(const replay::Options& options) {
    std::vector<base::NamedFile> files;
    for (const std::string& name : options.files) files.push_back({"the input", name});
    for (const std::string& name : options.baseline) files.push_back({"--baseline", name});
    if (options.properties) files.push_back({"--properties", *options.properties, true});
    for (const auto& [output, path] : options.outputs) {
        files.push_back({output->option, path, true});
    }
    return files;
}

/** What is missing where no input is named. */
std::string missingInput(const replay::Options& options) {
    std::string text = "FILE is missing: a trace or a capture to play";
    for (const base::NamedFile& file : filesOf(options)) {
        text += "; " + file.path + " is the file of " + file.use;
    }
    return text;
}

/** A file may be called like an option, but then "./" can stand before its name. */
std::string refuseOptionAsFile(const std::string& text) {
    return text.substr(0, 2) == "--" ? "takes a FILE, not " + text : std::string();
}

/**
 * Gives what is closed of the standard streams a file that holds nothing, so that no file which is
 * opened later becomes one of them. Returns whether standard output was open.
 */
bool openStandardStreams() {
    const bool hasOutput = fcntl(STDOUT_FILENO, F_GETFD) >= 0;
    for (int fd = open("/dev/null", O_RDWR); fd >= 0; fd = open("/dev/null", O_RDWR)) {
        if (fd <= STDERR_FILENO) continue;
        close(fd);
        break;
    }
    return hasOutput;
}

}  // namespace

int main(int argc, char** argv) {
    if (!openStandardStreams()) {
        std::cerr << "cannot write standard output: it is closed\n";
        return base::kStatusFailed;
    }
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
            ->check([](const std::string& text) {
                int number = 0;
                return CLI::detail::lexical_cast(text, number) && number > 0
                               ? std::string()
                               : "takes a number of at least 1, not " + text;
            });
    const auto addFile = [&](const char* name, auto* path, const char* what) {
        return app.add_option(name, *path, what)->type_name("FILE")->check(refuseOptionAsFile);
    };
    addFile("--properties", &options.properties,
            "keep the system properties in FILE (made if missing)");
    for (const replay::FileOutput& output : replay::fileOutputs()) {
        const auto ask = [&options, &output](const std::string& path) {
            options.outputs.push_back({&output, path});
        };
        app.add_option_function<std::string>(output.option, ask, output.help)
                ->type_name("FILE")
                ->check(refuseOptionAsFile)
                ->excludes(printTrace);
    }
    auto* baseline = addFile("--baseline", &options.baseline,
                             "say how the inputs differ from FILE; may be repeated")
                             ->allow_extra_args(false);
    for (const char* other : {"--log", "--check", "--print-trace", "--properties", "--timeline"}) {
        baseline->excludes(app.get_option(other));
    }
    bool listCalls = false;
    app.add_flag("--list-calls", listCalls, "list the calls that a trace can make, and exit");
    app.add_option("FILE", options.files, "traces and captures; - is standard input");
    try {
        app.parse(argc, argv);
        if (options.files.empty() && !listCalls) {
            throw CLI::ValidationError(missingInput(options));
        }
    } catch (const CLI::ExtrasError& error) {
        return refuseOption(app, error);
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() != 0) {
            std::cerr << error.what() << '\n';
            return base::kStatusBadInput;
        }
        app.exit(error);  // help or version
        return std::cout.flush() ? 0 : base::kStatusFailed;
    }
    if (const auto clash = base::findClash(filesOf(options))) {
        std::cerr << clash->text << '\n';
        return clash->status;
    }
    if (listCalls) {
        return std::cout << trace::listCalls() << std::flush ? 0 : base::kStatusFailed;
    }
    const char* noColour = std::getenv("NO_COLOR");
    options.colours = isatty(STDOUT_FILENO) != 0 && (noColour == nullptr || *noColour == '\0');
    if (isatty(STDOUT_FILENO) != 0) options.columns = terminalColumns();
    return replay::replayFiles(options);
}
