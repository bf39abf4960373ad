#include "replay/Replay.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <unistd.h>

#include "base/Result.h"
#include "platform/Display.h"
#include "replay/FilePlayer.h"
#include "replay/InputFile.h"
#include "replay/Jobs.h"
#include "replay/Progress.h"

namespace replay {

using base::Failure;

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
            mPlayer(options, &mProgress) {
        mDevice.propertyFile = options.properties;
    }

    int run() {
        if (const auto failure = mPlayer.openOutputs()) return say(failure);
        const int status = playAll();
        // Of a run that failed nothing is made: what was there before stays.
        if (status != 0 && status != base::kStatusDiffers) return status;
        const int finished = say(mPlayer.finish());
        return status != 0 ? status : finished;
    }

private:
    int playAll() {
        for (const std::string& name : mOptions.baseline) {
            if (const int status = playInMemory(name); status != 0) return status;
        }
        const std::vector<std::string>& files = mOptions.files;
        if (mOptions.merge) return inMemory(files.front(), [&] { return runMerged(); });
        Jobs jobs(
                mOptions.jobs, mPlayer.outputs(),
                [this](const std::string& name) { return playInMemory(name); },
                [this](size_t done) { mProgress.show(done, "", 0); });
        for (auto next = files.begin(); next != files.end();) {
            const auto end =
                    mayUseJobs() ? std::find_if_not(next, files.end(), isSurelyCapture) : next;
            int status = 0;
            if (end - next > 1) {
                status = jobs.run({next, end});
                next = end;
            } else {
                status = playInMemory(*next++);
            }
            if (status != 0) return status;
        }
        return 0;
    }

    /** What is made of all inputs together needs their days in this process. */
    bool mayUseJobs() const {
        return mOptions.jobs > 1 && !mOptions.properties && !mOptions.printTrace &&
               !mOptions.page && !mOptions.timeline && mOptions.baseline.empty();
    }

    /** What `work` with a file returns, or says, if there is not enough memory for it. */
    template <typename Work>
    static int inMemory(const std::string& name, Work work) {
        try {
            return work();
        } catch (const std::bad_alloc&) {
            return say(Failure{name + ": not enough memory", base::kStatusFailed});
        }
    }

    int runMerged() {
        return say(mOptions.printTrace ? mPlayer.printMerged() : mPlayer.playMerged(&mDevice));
    }

    int playInMemory(const std::string& name) {
        return inMemory(name, [&] { return play(name); });
    }

    int play(const std::string& name) {
        InputFile file;
        if (const auto failure = open(name, mOptions.inputs(), &file)) return say(failure);
        if (mOptions.printTrace) return say(mPlayer.printTrace(std::move(file)));
        return say(mPlayer.play(std::move(file), &mDevice));
    }

    const Options& mOptions;
    Progress mProgress;
    FilePlayer mPlayer;
    Device mDevice;
};

}  // namespace

int replayFiles(const Options& options) {
    // A write beyond the limit of a file's size is an error, and not the end of the tool.
    std::signal(SIGXFSZ, SIG_IGN);
    if (const auto error = platform::shareDisplay()) {
        return say(Failure{*error, base::kStatusFailed});
    }
    return Replay(options).run();
}

}  // namespace replay
