#include "replay/InputPlayer.h"

#include <cerrno>
#include <cstring>
#include <memory>
#include <new>
#include <utility>

#include <sys/mman.h>
#include <unistd.h>

#include "base/FileIo.h"
#include "capture/CaptureImport.h"
#include "platform/PropertyService.h"
#include "replay/RealTime.h"

namespace replay {

using base::Failure;
using trace::Record;

namespace {

/** Makes `text` a file that is read from its start; -1, with `errno`, if that fails. */
int memoryFile(const std::string& text) {
    const int fd = memfd_create("trace", MFD_CLOEXEC);
    if (fd >= 0 && base::writeAll(fd, text.data(), text.size()) && lseek(fd, 0, SEEK_SET) == 0) {
        return fd;
    }
    if (fd >= 0) close(fd);
    return -1;
}

}  // namespace

InputPlayer::InputPlayer(const Options& options, Audience audience)
      : mOptions(options),
        mAudience(std::move(audience)) {
    mDevice.propertyFile = options.properties;
}

bool InputPlayer::play(const std::string& name) {
    return inMemory(name, [&] { return playFile(name); });
}

bool InputPlayer::playMerged() {
    const std::vector<std::string>& files = mOptions.files;
    return inMemory(files.front(), [&] {
        const size_t others = files.size() - 1;
        return playCapture(
                files.front() + (others > 0 ? " and " + std::to_string(others) + " more" : ""),
                importCaptures(files, mOptions.inputs()));
    });
}

template <typename Play>
bool InputPlayer::inMemory(const std::string& name, Play play) {
    try {
        return play();
    } catch (const std::bad_alloc&) {
        return fail({name + ": not enough memory", base::kStatusFailed});
    }
}

bool InputPlayer::playFile(const std::string& name) {
    auto file = open(name, mOptions.inputs());
    if (!file) return fail(file.error());
    if (!file->isCapture()) return playLines(&*file, &mDevice);
    capture::CaptureImport import;
    import.add(name, *file->first, file->lines.get());
    return playCapture(name, import.finish());
}

bool InputPlayer::playCapture(const std::string& name,
                              const base::Result<capture::ImportedCapture>& imported) {
    if (!imported) return fail(imported.error());
    for (const std::string& warning : imported->warnings) {
        mAudience.take({Record::Kind::kWarning, 0, {warning}});
    }
    const int fd = memoryFile(imported->trace);
    if (fd < 0) {
        return fail(
                {name + ": cannot keep the trace: " + std::strerror(errno), base::kStatusFailed});
    }
    InputFile file{name, std::make_unique<base::LineReader>(fd), {}};
    file.first = file.lines->next();
    Device ownDevice;
    ownDevice.propertyFile = mDevice.propertyFile;
    return playLines(&file, &ownDevice);
}

bool InputPlayer::playLines(InputFile* file, Device* device) {
    const int64_t started = realTime();
    mAudience.take({Record::Kind::kInput, 0, {file->name}});
    trace::TraceReader reader(file->name, file->lines.get());
    if (mOptions.check) reader.allowTornEnd();
    base::Result<void> played;
    if (file->first) {
        trace::TraceLine first;
        played = reader.judge(*file->first, &first);
        if (played) played = playBoots(&reader, first, device);
    }
    if (!played) fail(played.error());
    mAudience.take({Record::Kind::kPlayed, 0, {}, realTime() - started});
    return played.has_value();
}

base::Result<void> InputPlayer::playBoots(trace::TraceReader* reader, const trace::TraceLine& first,
                                          Device* device) {
    if (device->propertyFile) {
        if (const auto error = platform::pinPropertyFile(*device->propertyFile)) {
            return base::fail(*error);
        }
    }
    const Listener listener{mAudience.take,
                            [&] { mAudience.idle(reader->name(), reader->lineNumber()); }};
    Boot boot{trace::BootKind::kDevice, first.at, {}};
    for (const trace::TraceLine* line = &first;; line = nullptr) {
        auto next = runBoot(boot, line, mAudience.wanted(), device, reader, listener);
        if (!next) return tl::unexpected(std::move(next.error()));
        if (!*next) return {};
        boot = std::move(**next);
    }
}

bool InputPlayer::fail(const Failure& failure) {
    mAudience.take({Record::Kind::kFailure, 0, {failure.text}, failure.status});
    return false;
}

}  // namespace replay
