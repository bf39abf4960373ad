#include "replay/FilePlayer.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

#include <sys/mman.h>
#include <unistd.h>

#include "capture/CaptureImport.h"
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

FilePlayer::FilePlayer(const Options& options, Progress* progress) : mProgress(progress) {
    if (options.check) {
        mReports.push_back(std::make_unique<report::Check>(&mOut));
    } else if (options.json) {
        mReports.push_back(std::make_unique<report::JsonLines>(&mOut, options.files.size() > 1));
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
    Device ownDevice;
    ownDevice.propertyFile = device->propertyFile;
    report::Input input{file.name};
    capture::ImportedCapture imported;
    const bool isCapture = file.isCapture();
    if (isCapture) {
        if (auto failure = importTrace(&file, &imported)) return failure;
        input.origin = &imported.origin;
        input.warnings = imported.warnings;
        const int fd = memoryFile(imported.trace);
        if (fd < 0) {
            return Failure{file.name + ": cannot keep the trace: " + std::strerror(errno),
                           trace::kStatusFailed};
        }
        file.lines = std::make_unique<trace::LineReader>(fd);
        file.first = file.lines->next();
    }
    for (const auto& report : mReports) report->begin(input);
    trace::TraceReader reader(file.name, file.lines.get());
    trace::TraceLine first;
    mFailure.reset();
    if (file.first && reader.judge(*file.first, &first, &mFailure)) {
        playTrace(&reader, isCapture ? &ownDevice : device, first);
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
    if (!file.isCapture()) return Failure{file.name + ": not a device capture"};
    capture::ImportedCapture imported;
    if (auto failure = importTrace(&file, &imported)) return failure;
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

std::optional<Failure> FilePlayer::importTrace(InputFile* file,
                                               capture::ImportedCapture* imported) {
    *imported = capture::importCapture(file->name, *file->first, file->lines.get());
    if (!imported->error.empty()) return Failure{imported->error};
    for (const std::string& warning : imported->warnings) {
        std::fprintf(stderr, "%s\n", warning.c_str());
    }
    return {};
}

}  // namespace replay
