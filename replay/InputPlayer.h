#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "base/Result.h"
#include "capture/ImportedCapture.h"
#include "replay/BootProcess.h"
#include "replay/InputFile.h"
#include "replay/Options.h"
#include "trace/Record.h"
#include "trace/TraceLine.h"
#include "trace/TraceReader.h"

namespace replay {

/** Who hears what becomes of inputs. */
struct Audience {
    std::function<void(const trace::Record&)> take;
    std::function<trace::WantedRecords()> wanted;  // asked before each boot

    /** No records come for now; `line` of the input `name` has been read. */
    std::function<void(const std::string& name, int64_t line)> idle;
};

/**
 * Plays inputs, each boot in a process of its own, and tells an audience all that comes of them:
 * `kInput`, the records of its boots, `kPlayed`. Warnings come before; a failure before `kPlayed`,
 * or alone if there is nothing to be played.
 */
class InputPlayer {
public:
    /** `options` must outlive this. */
    InputPlayer(const Options& options, Audience audience);

    /**
     * Plays the input `name`. A capture is a device of its own; traces are played on one device,
     * one after another. Returns whether it was played to its end.
     */
    bool play(const std::string& name);

    /** Plays all files of the options as captures of one device. Returns the same. */
    bool playMerged();

private:
    template <typename Play>
    bool inMemory(const std::string& name, Play play);
    bool playFile(const std::string& name);
    bool playCapture(const std::string& name,
                     const base::Result<capture::ImportedCapture>& imported);
    bool playLines(InputFile* file, Device* device);
    base::Result<void> playBoots(trace::TraceReader* reader, const trace::TraceLine& first,
                                 Device* device);

    /** Tells of the failure. Returns false. */
    bool fail(const base::Failure& failure);

    const Options& mOptions;
    const Audience mAudience;
    Device mDevice;
};

}  // namespace replay
