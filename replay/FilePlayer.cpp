#include "replay/FilePlayer.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

#include <sys/mman.h>
#include <unistd.h>

#include "platform/PropertyService.h"
#include "report/Check.h"
#include "report/Lines.h"
#include "report/Page.h"
#include "report/Summary.h"
#include "report/Timeline.h"
#include "trace/FileIo.h"

namespace replay {

using trace::Failure;

namespace {

/** Makes `text` a file that is read from its start; -1, with `errno`, if that fails. */
int memoryFile(const std::string& text) {
    const int fd = memfd_create("trace", MFD_CLOEXEC);
    if (fd >= 0 && trace::writeAll(fd, text.data(), text.size()) && lseek(fd, 0, SEEK_SET) == 0) {
        return fd;
    }
    if (fd >= 0) close(fd);
    return -1;
}

}  // namespace

FilePlayer::FilePlayer(const Options& options, Progress* progress)
      : mOptions(options),
        mProgress(progress) {
    if (options.check) {
        mReports.push_back(std::make_unique<report::Check>(&mOut));
    } else if (options.json) {
        mReports.push_back(std::make_unique<report::JsonLines>(&mOut, options.inputs() > 1));
    } else if (options.log) {
        mReports.push_back(std::make_unique<report::LogLines>(&mOut));
    } else {
        mReports.push_back(std::make_unique<report::Summary>(&mOut, options.all, options.colours));
    }
    if (options.timeline) {
        mReports.push_back(std::make_unique<report::Timeline>(*options.timeline));
    }
    if (options.page) mReports.push_back(std::make_unique<report::Page>(*options.page));
    for (const auto& report : mReports) mWantsCalls |= report->wantsCalls();
}

std::optional<Failure> FilePlayer::play(InputFile file, Device* device) {
    if (!file.isCapture()) return playLines(&file, {file.name}, device);
    capture::CaptureImport import;
    import.add(file.name, *file.first, file.lines.get());
    return playCapture(file.name, import.finish(), *device);
}

std::optional<Failure> FilePlayer::playMerged(Device* device) {
    capture::CaptureImport import;
    if (auto failure = addAll(&import)) return failure;
    const size_t others = mOptions.files.size() - 1;
    const std::string name =
            mOptions.files.front() + (others > 0 ? " and " + std::to_string(others) + " more" : "");
    return playCapture(name, import.finish(), *device);
}

std::optional<Failure> FilePlayer::playCapture(const std::string& name,
                                               const capture::ImportedCapture& imported,
                                               const Device& device) {
    if (auto failure = tell(imported)) return failure;
    const int fd = memoryFile(imported.trace);
    if (fd < 0) {
        return Failure{name + ": cannot keep the trace: " + std::strerror(errno),
                       trace::kStatusFailed};
    }
    InputFile file{name, std::make_unique<trace::LineReader>(fd), {}};
    file.first = file.lines->next();
    Device ownDevice;
    ownDevice.propertyFile = device.propertyFile;
    return playLines(&file, {name, &imported.origin, imported.warnings}, &ownDevice);
}

std::optional<Failure> FilePlayer::playLines(InputFile* file, const report::Input& input,
                                             Device* device) {
    for (const auto& report : mReports) report->begin(input);
    trace::TraceReader reader(file->name, file->lines.get());
    trace::TraceLine first;
    mFailure.reset();
    if (file->first && reader.judge(*file->first, &first, &mFailure)) {
        playTrace(&reader, device, first);
    }
    mProgress->clear();
    for (const auto& report : mReports) report->end(!mFailure);
    mOut.flush();
    ++mPlayed;
    for (const auto& report : mReports) {
        if (!mFailure) mFailure = report->failure();
    }
    return mFailure;
}

void FilePlayer::playTrace(trace::TraceReader* reader, Device* device,
                           const trace::TraceLine& first) {
    if (device->propertyFile) {
        if (const auto error = platform::pinPropertyFile(*device->propertyFile)) {
            mFailure = Failure{*error};
            return;
        }
    }
    const auto run = [&](const Boot& boot, const trace::TraceLine* line) {
        return runBoot(
                boot, line, mWantsCalls, device, reader,
                [this](const report::Record& record) {
                    for (const auto& report : mReports) report->take(record);
                },
                [this, reader] {
                    mOut.flush();
                    mProgress->show(mPlayed, reader->name(), reader->lineNumber());
                },
                &mFailure);
    };
    NextBoot next = run(Boot{trace::BootKind::kDevice, first.at}, &first);
    while (next) next = run(*next, nullptr);
}

std::optional<Failure> FilePlayer::printTrace(InputFile file) {
    capture::CaptureImport import;
    if (auto failure = add(&file, &import)) return failure;
    return printCapture(import.finish());
}

std::optional<Failure> FilePlayer::printMerged() {
    capture::CaptureImport import;
    if (auto failure = addAll(&import)) return failure;
    return printCapture(import.finish());
}

std::optional<Failure> FilePlayer::printCapture(const capture::ImportedCapture& imported) {
    if (auto failure = tell(imported)) return failure;
    const std::string& text = imported.trace;
    if (mPrintedTrace) {
        // The next device's clock starts at its first line's time.
        mOut.write(text.substr(0, text.find(',')) + ", \"boot\": \"device\"}\n");
    }
    mPrintedTrace = true;
    mOut.write(text);
    mOut.flush();
    return {};
}

std::optional<Failure> FilePlayer::add(InputFile* file, capture::CaptureImport* import) {
    if (!file->isCapture()) return Failure{file->name + ": not a device capture"};
    import->add(file->name, *file->first, file->lines.get());
    return {};
}

std::optional<Failure> FilePlayer::addAll(capture::CaptureImport* import) {
    for (const std::string& name : mOptions.files) {
        InputFile file;
        if (auto failure = open(name, &file)) return failure;
        if (auto failure = add(&file, import)) return failure;
    }
    return {};
}

std::optional<Failure> FilePlayer::tell(const capture::ImportedCapture& imported) {
    if (!imported.error.empty()) return Failure{imported.error};
    for (const std::string& warning : imported.warnings) {
        std::fprintf(stderr, "%s\n", warning.c_str());
    }
    return {};
}

}  // namespace replay
