#include "replay/Replay.h"

#include <csignal>
#include <cstdio>
#include <new>
#include <optional>
#include <string>
#include <utility>

#include "platform/Display.h"
#include "replay/FilePlayer.h"
#include "replay/InputFile.h"
#include "replay/Jobs.h"

namespace replay {

using trace::Failure;

namespace {

/** Says what is wrong, if something is. Returns the exit status. */
int say(const std::optional<Failure>& failure) {
    if (!failure) return 0;
    std::fprintf(stderr, "%s\n", failure->text.c_str());
    return failure->status;
}

/** The days of one device, and between them other devices' captures. */
class Replay {
public:
    explicit Replay(const Options& options)
          : mOptions(options),
            mPlayer(options),
            mJobs(options.jobs) {
        mDevice.propertyFile = options.properties;
    }

    int run() {
        for (const std::string& name : mOptions.files) {
            int status = 0;
            try {
                status = runFile(name);
            } catch (const std::bad_alloc&) {
                status = say(Failure{name + ": not enough memory", trace::kStatusFailed});
            }
            if (status != 0) return status;
        }
        return mJobs.finish();
    }

private:
    int runFile(const std::string& name) {
        InputFile file;
        const auto failure = open(name, &file);
        const bool isJob = !failure && file.isCapture() && mOptions.jobs > 1 &&
                           !mOptions.properties && !mOptions.printTrace;
        if (isJob) {
            return mJobs.start([&] { return say(mPlayer.play(std::move(file), &mDevice)); });
        }
        if (const int status = mJobs.finish()) return status;
        if (failure) return say(failure);
        if (mOptions.printTrace) return say(mPlayer.printTrace(std::move(file)));
        return say(mPlayer.play(std::move(file), &mDevice));
    }

    const Options& mOptions;
    FilePlayer mPlayer;
    Jobs mJobs;
    Device mDevice;
};

}  // namespace

int replayFiles(const Options& options) {
    // A write beyond the limit of a file's size is an error, and not the end of the tool.
    std::signal(SIGXFSZ, SIG_IGN);
    if (const auto error = platform::shareDisplay()) {
        return say(Failure{*error, trace::kStatusFailed});
    }
    return Replay(options).run();
}

}  // namespace replay
