#include "replay/Replay.h"

#include <csignal>
#include <cstdio>
#include <new>
#include <optional>
#include <string>
#include <utility>

#include <unistd.h>

#include "platform/Display.h"
#include "replay/FilePlayer.h"
#include "replay/InputFile.h"
#include "replay/Jobs.h"
#include "replay/Progress.h"

namespace replay {

using trace::Failure;

namespace {

/** Says what is wrong, if something is. Returns the exit status. */
int say(const std::optional<Failure>& failure) {
    if (!failure) return 0;
    std::fprintf(stderr, "%s\n", failure->text.c_str());
    return failure->status;
}

/** Whether what appears on a terminal shows by itself how far the replay has come. */
bool showsItself(const Options& options) {
    const bool asTheyCome =
            options.json || options.log || options.printTrace || options.inputs() > 1;
    return asTheyCome && isatty(STDOUT_FILENO) != 0;
}

/** The days of one device, and between them other devices' captures. */
class Replay {
public:
    explicit Replay(const Options& options)
          : mOptions(options),
            mProgress(options.inputs(), !showsItself(options)),
            mPlayer(options, &mProgress),
            mJobs(options.jobs, [this](size_t ended) { mProgress.show(ended, "", 0); }) {
        mDevice.propertyFile = options.properties;
    }

    int run() {
        const std::string& first = mOptions.files.front();
        if (mOptions.merge) return inMemory(first, [&] { return runMerged(); });
        for (const std::string& name : mOptions.files) {
            if (const int status = inMemory(name, [&] { return runFile(name); })) return status;
        }
        return mJobs.finish();
    }

private:
    /** What `work` with a file returns, or says, if there is not enough memory for it. */
    template <typename Work>
    static int inMemory(const std::string& name, Work work) {
        try {
            return work();
        } catch (const std::bad_alloc&) {
            return say(Failure{name + ": not enough memory", trace::kStatusFailed});
        }
    }

    int runMerged() {
        return say(mOptions.printTrace ? mPlayer.printMerged() : mPlayer.playMerged(&mDevice));
    }

    int runFile(const std::string& name) {
        InputFile file;
        const auto failure = open(name, &file);
        const bool mayBeJob = mOptions.jobs > 1 && mOptions.files.size() > 1 &&
                              !mOptions.properties && !mOptions.printTrace;
        const bool isJob = mayBeJob && !failure && file.isCapture();
        if (isJob) {
            return mJobs.start([&] { return say(mPlayer.play(std::move(file), &mDevice)); });
        }
        if (const int status = mJobs.finish()) return status;
        if (failure) return say(failure);
        if (mOptions.printTrace) return say(mPlayer.printTrace(std::move(file)));
        return say(mPlayer.play(std::move(file), &mDevice));
    }

    const Options& mOptions;
    Progress mProgress;
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
