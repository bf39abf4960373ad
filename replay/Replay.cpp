#include "replay/Replay.h"

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <memory>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "capture/CaptureImport.h"
#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "replay/Player.h"
#include "trace/FileIo.h"
#include "trace/LineReader.h"
#include "trace/TraceLine.h"

namespace replay {

namespace {

/** What a process leaves to the tool when its part of the trace is over. */
struct Report {
    bool boots;  // by a boot line: `next`
    Boot next;
};

/** Plays files; between two boots it only keeps what outlives a process. */
class Replay {
public:
    explicit Replay(const Options& options) : mOptions(options), mOutput(options.format) {
        platform::shareDisplay();
    }

    int run() {
        for (const std::string& file : mOptions.files) {
            mName = file;
            runFile();
            if (mFailure) {
                std::fprintf(stderr, "%s\n", mFailure->text.c_str());
                return mFailure->status;
            }
            if (mStatus != 0) return mStatus;
        }
        return 0;
    }

private:
    void fail(const std::string& text, int status = kStatusBadInput) {
        mFailure = Failure{text, status};
    }

    void runFile() {
        const int fd = mName == "-" ? dup(STDIN_FILENO) : open(mName.c_str(), O_RDONLY | O_CLOEXEC);
        if (fd < 0) return fail(mName + ": cannot open: " + std::strerror(errno));
        mReader = std::make_unique<trace::LineReader>(fd);
        std::optional<std::string_view> text = mReader->next();
        while (text && trace::isSkipped(*text)) text = mReader->next();
        if (mReader->error()) {
            fail(mName + ':' + std::to_string(mReader->lineNumber()) + ": " + *mReader->error());
        } else if (text && text->find_first_not_of(" \t") != text->find('{')) {
            runCapture(*text);
        } else if (mOptions.printTrace) {
            fail(mName + ": not a device capture");
        } else if (text) {
            trace::TraceLine first;
            if (const auto error = mParser.parse(*text, mName, &first)) {
                fail(mName + ':' + std::to_string(mReader->lineNumber()) + ": " + *error);
            } else {
                runTrace(first);
            }
        }
    }

    void runCapture(std::string_view firstLine) {
        const capture::ImportedCapture imported =
                capture::importCapture(mName, firstLine, mReader.get());
        if (!imported.error.empty()) return fail(imported.error);
        for (const std::string& warning : imported.warnings) {
            std::fprintf(stderr, "%s\n", warning.c_str());
        }
        if (mOptions.printTrace) {
            if (!trace::writeAll(STDOUT_FILENO, imported.trace.data(), imported.trace.size())) {
                fail(std::string("cannot write standard output: ") + std::strerror(errno),
                     kStatusFailed);
            }
            return;
        }
        const int fd = memfd_create("trace", MFD_CLOEXEC);
        if (fd < 0 || !trace::writeAll(fd, imported.trace.data(), imported.trace.size()) ||
            lseek(fd, 0, SEEK_SET) != 0) {
            return fail(mName + ": cannot keep the trace: " + std::strerror(errno), kStatusFailed);
        }
        mReader = std::make_unique<trace::LineReader>(fd);
        trace::TraceLine first;
        if (readLine(mName, mReader.get(), &mParser, &first, &mFailure)) runTrace(first);
    }

    void runTrace(const trace::TraceLine& first) {
        NextBoot boot = runProcess(Boot{trace::BootKind::kDevice, first.at}, &first);
        while (boot) boot = runProcess(*boot, nullptr);
    }

    /** Runs one boot in a process of its own. */
    NextBoot runProcess(const Boot& boot, const trace::TraceLine* first) {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0) {
            fail(std::string("cannot make a pipe: ") + std::strerror(errno), kStatusFailed);
            return {};
        }
        const pid_t tool = getpid();
        const pid_t child = fork();
        if (child == 0) {
            // The process goes when the tool goes, however that happens.
            prctl(PR_SET_PDEATHSIG, SIGKILL);
            if (getppid() != tool) _exit(kStatusFailed);
            _exit(playAndReport(boot, first, ends[1]));
        }
        close(ends[1]);
        const std::vector<unsigned char> bytes = trace::readAll(ends[0]);
        close(ends[0]);
        if (child < 0) {
            fail(std::string("cannot start a process: ") + std::strerror(errno), kStatusFailed);
            return {};
        }
        return takeReport(child, bytes);
    }

    int playAndReport(const Boot& boot, const trace::TraceLine* first, int reportFd) {
        if (mOptions.properties) {
            if (const auto error = platform::openProperties(*mOptions.properties)) {
                fail(*error);
            }
        } else if (!mProperties.empty()) {
            platform::restoreProperties(mProperties);
        }
        NextBoot next;
        if (!mFailure) next = play(boot, first, mName, mReader.get(), &mOutput, &mFailure);
        mOutput.flush();
        if (const auto error = platform::propertyFileError(); error && !mFailure) fail(*error);
        std::vector<unsigned char> properties;
        if (mOptions.properties) {
            platform::closeProperties();
        } else {
            properties = platform::saveProperties();
        }
        if (mFailure) {
            std::fprintf(stderr, "%s\n", mFailure->text.c_str());
            return mFailure->status;
        }
        const Report report{next.has_value(), next.value_or(Boot{})};
        const bool told = trace::writeAll(reportFd, &report, sizeof(report)) &&
                          trace::writeAll(reportFd, properties.data(), properties.size());
        return told ? 0 : kStatusFailed;
    }

    NextBoot takeReport(pid_t child, const std::vector<unsigned char>& bytes) {
        int status = 0;
        while (waitpid(child, &status, 0) < 0 && errno == EINTR) {}
        if (WIFSIGNALED(status)) {
            if (WTERMSIG(status) == SIGPIPE) raise(SIGPIPE);  // nobody reads the output any more
            fail(mName + ':' + std::to_string(mReader->lineNumber()) +
                         ": the process died here or just before: " + strsignal(WTERMSIG(status)),
                 kStatusFailed);
            return {};
        }
        Report report;
        if (WEXITSTATUS(status) != 0 || bytes.size() < sizeof(report)) {
            mStatus = WEXITSTATUS(status) != 0 ? WEXITSTATUS(status) : kStatusFailed;
            return {};
        }
        std::memcpy(&report, bytes.data(), sizeof(report));
        mProperties.assign(bytes.begin() + sizeof(report), bytes.end());
        return report.boots ? NextBoot(report.next) : std::nullopt;
    }

    const Options& mOptions;
    report::Output mOutput;
    trace::TraceParser mParser;

    std::string mName;  // of the file being played
    std::unique_ptr<trace::LineReader> mReader;
    std::vector<unsigned char> mProperties;  // if no file keeps them

    std::optional<Failure> mFailure;  // not yet said
    int mStatus = 0;                  // of a failure that a process has said
};

}  // namespace

int replayFiles(const Options& options) {
    return Replay(options).run();
}

}  // namespace replay
