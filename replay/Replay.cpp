#include "replay/Replay.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <new>
#include <string>
#include <vector>

#include <unistd.h>

#include "base/Result.h"
#include "platform/Display.h"
#include "replay/InputFile.h"
#include "replay/InputPlayer.h"
#include "replay/Jobs.h"
#include "replay/Outputs.h"
#include "replay/Player.h"
#include "replay/Progress.h"
#include "replay/TracePrinter.h"

namespace replay {

using trace::Record;

namespace {

/** Says what is wrong, if something is. Returns the exit status. */
int say(const base::Result<void>& result) {
    if (result) return 0;
    std::fprintf(stderr, "%s\n", result.error().text.c_str());
    return result.error().status;
}

/** Whether what appears on a terminal shows by itself how far the replay has come. */
bool showsItself(const Options& options) {
    const bool asTheyCome = options.json || options.log || options.inputs() > 1;
    return asTheyCome && isatty(STDOUT_FILENO) != 0;
}

/** The days of one device, and between them other devices' captures. */
class Replay {
public:
    explicit Replay(const Options& options)
          : mOptions(options),
            mProgress(options.inputs(), !showsItself(options)),
            mOutputs(options, &mProgress),
            mPlayer(options, {[this](const Record& record) { take(record); },
                              [this] { return mOutputs.wanted(); },
                              [this](const std::string& name, int64_t line) {
                                  mOutputs.flush();
                                  mProgress.show(mPlayed, name, line);
                              }}) {}

    int run() {
        if (const auto opened = mOutputs.open(mOptions); !opened) return say(opened);
        const int status = say(playAll());
        // Of a run that failed nothing is made: what was there before stays.
        if (status != 0 && status != base::kStatusDiffers) return status;
        const int finished = say(mOutputs.finish());
        return status != 0 ? status : finished;
    }

private:
    base::Result<void> playAll() {
        if (mOptions.merge) {
            for (const std::string& name : mOptions.baseline) {
                if (!mPlayer.play(name)) return result();
            }
            mPlayer.playMerged();
            return result();
        }
        std::vector<std::string> names = mOptions.baseline;
        names.insert(names.end(), mOptions.files.begin(), mOptions.files.end());
        const bool mayUseJobs = mOptions.jobs > 1 && !mOptions.properties;
        for (auto next = names.begin(); next != names.end() && !mOutputs.failure();) {
            const auto end =
                    mayUseJobs ? std::find_if_not(next, names.end(), isSurelyCapture) : next;
            if (end - next > 1) {
                if (auto ran = playAtOnce({next, end}); !ran) return ran;
                next = end;
            } else {
                mPlayer.play(*next++);
            }
        }
        return result();
    }

    base::Result<void> playAtOnce(const std::vector<std::string>& captures) {
        // A capture's first note asks for the records of calls.
        const trace::WantedRecords wanted{true, mOutputs.wanted().counters};
        const auto play = [&](const std::string& name, trace::RecordWriter* records) {
            preload();
            const Audience audience{[&](const Record& record) { records->add(record); },
                                    [&] { return wanted; }, [](const std::string&, int64_t) {}};
            return InputPlayer(mOptions, audience).play(name);
        };
        const auto takeAll = [this](const std::string& records) {
            trace::RecordReader().take(records.data(), records.size(),
                                       [this](const Record& record) { take(record); });
            return !mOutputs.failure();
        };
        const auto tell = [played = mPlayed, this](size_t done) {
            mProgress.show(played + done, "", 0);
        };
        return Jobs(mOptions.jobs, play, takeAll, tell).run(captures);
    }

    void take(const Record& record) {
        mOutputs.take(record);
        if (record.kind == Record::Kind::kPlayed) ++mPlayed;
    }

    base::Result<void> result() const {
        if (mOutputs.failure()) return tl::unexpected(*mOutputs.failure());
        return {};
    }

    const Options& mOptions;
    Progress mProgress;
    Outputs mOutputs;
    InputPlayer mPlayer;
    size_t mPlayed = 0;  // inputs
};

}  // namespace

int replayFiles(const Options& options) {
    // A write beyond the limit of a file's size is an error, and not the end of the tool.
    std::signal(SIGXFSZ, SIG_IGN);
    try {
        if (options.printTrace) return say(printTraces(options));
        if (const auto error = platform::shareDisplay()) {
            return say(base::fail(*error, base::kStatusFailed));
        }
        return Replay(options).run();
    } catch (const std::bad_alloc&) {
        return say(base::fail("not enough memory", base::kStatusFailed));
    }
}

}  // namespace replay
