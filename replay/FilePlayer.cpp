#include "replay/FilePlayer.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

#include <sys/mman.h>
#include <unistd.h>

#include "base/FileIo.h"
#include "base/Json.h"
#include "base/Result.h"
#include "platform/PropertyService.h"
#include "report/Check.h"
#include "report/Compare.h"
#include "report/Csv.h"
#include "report/Lines.h"
#include "report/Page.h"
#include "report/Summary.h"
#include "report/TimelineFile.h"

namespace replay {

using base::Failure;

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

FilePlayer::FilePlayer(const Options& options, Progress* progress)
      : mOptions(options),
        mProgress(progress) {
    const report::Looks looks{options.all, options.colours, options.columns};
    if (options.check) {
        add(std::make_unique<report::Check>(&mOut));
    } else if (!options.baseline.empty()) {
        const size_t baselines = options.baseline.size();
        if (options.json) {
            add(std::make_unique<report::CompareLines>(&mOut, baselines));
        } else {
            add(std::make_unique<report::CompareSummary>(&mOut, baselines, looks));
        }
    } else if (options.json) {
        add(std::make_unique<report::JsonLines>(&mOut, options.inputs() > 1));
    } else if (options.log) {
        add(std::make_unique<report::LogLines>(&mOut));
    } else {
        add(std::make_unique<report::Summary>(&mOut, looks));
    }
}

std::optional<Failure> FilePlayer::openOutputs() {
    const auto open = [this](const std::optional<std::string>& path,
                             const auto& make) -> std::optional<Failure> {
        if (!path) return {};
        auto file = base::OutputFile::create(*path);
        if (!file) return file.error();
        mFiles.push_back(std::move(*file));
        add(make(&mFiles.back()));
        return {};
    };
    auto failure = open(mOptions.timeline, [this](base::OutputFile* file) {
        return std::make_unique<report::TimelineFile>(file, mOptions.inputs() > 1);
    });
    if (!failure) {
        failure = open(mOptions.page, [this](base::OutputFile* file) {
            return std::make_unique<report::Page>(file, mOptions.baseline.size());
        });
    }
    const auto openTable = [&](const auto& path, const auto& make) {
        if (failure || !path) return;
        failure = open(path, make);
        if (!failure) mTables.push_back(fileno(mFiles.back().file()));
    };
    openTable(mOptions.uses, std::make_unique<report::UsesCsv, base::OutputFile*>);
    openTable(mOptions.sinceCharge, std::make_unique<report::SinceChargeCsv, base::OutputFile*>);
    return failure;
}

std::vector<int> FilePlayer::outputs() const {
    std::vector<int> outputs{STDOUT_FILENO, STDERR_FILENO};
    outputs.insert(outputs.end(), mTables.begin(), mTables.end());
    return outputs;
}

std::optional<Failure> FilePlayer::play(InputFile file, Device* device) {
    if (!file.isCapture()) return playLines(&file, device);
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

std::optional<Failure> FilePlayer::playCapture(const std::string& name, const Import& imported,
                                               const Device& device) {
    if (auto failure = tell(imported)) return failure;
    const int fd = memoryFile(imported->trace);
    if (fd < 0) {
        return Failure{name + ": cannot keep the trace: " + std::strerror(errno),
                       base::kStatusFailed};
    }
    InputFile file{name, std::make_unique<base::LineReader>(fd), {}};
    file.first = file.lines->next();
    Device ownDevice;
    ownDevice.propertyFile = device.propertyFile;
    return playLines(&file, &ownDevice);
}

std::optional<Failure> FilePlayer::playLines(InputFile* file, Device* device) {
    for (const auto& report : mReports) report->begin(file->name);
    trace::TraceReader reader(file->name, file->lines.get());
    if (mOptions.check) reader.allowTornEnd();
    trace::TraceLine first;
    mFailure.reset();
    if (file->first) {
        if (const auto judged = reader.judge(*file->first, &first); !judged) {
            mFailure = judged.error();
        } else {
            playTrace(&reader, device, first);
        }
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
    const Listener listener{[this](const trace::Record& record) {
                                for (const auto& report : mReports) report->take(record);
                            },
                            [this, reader] {
                                mOut.flush();
                                mProgress->show(mPlayed, reader->name(), reader->lineNumber());
                            }};
    Boot boot{trace::BootKind::kDevice, first.at, {}};
    for (const trace::TraceLine* line = &first;; line = nullptr) {
        auto next = runBoot(boot, line, wantedRecords(), device, reader, listener);
        if (!next) mFailure = std::move(next.error());
        if (!next || !*next) return;
        boot = std::move(**next);
    }
}

trace::WantedRecords FilePlayer::wantedRecords() const {
    trace::WantedRecords wanted;
    for (const auto& report : mReports) {
        wanted.calls |= report->wanted().calls;
        wanted.counters |= report->wanted().counters;
    }
    return wanted;
}

std::optional<Failure> FilePlayer::finish() {
    for (const auto& report : mReports) {
        report->finish();
        if (report->failure()) return report->failure();
    }
    mOut.flush();
    for (base::OutputFile& file : mFiles) {
        if (const auto committed = file.commit(); !committed) return committed.error();
    }
    return {};
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

std::optional<Failure> FilePlayer::printCapture(const Import& imported) {
    if (auto failure = tell(imported)) return failure;
    if (mPrintedTrace) {
        // The next device's clock starts at its first line's time.
        std::string line;
        base::JsonWriter json(&line);
        json.beginObject().member("at", imported->start).member("boot", "device").endObject();
        mOut.write(line + '\n');
    }
    mPrintedTrace = true;
    mOut.write(imported->trace);
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
        if (auto failure = open(name, mOptions.inputs(), &file)) return failure;
        if (auto failure = add(&file, import)) return failure;
    }
    return {};
}

std::optional<Failure> FilePlayer::tell(const Import& imported) {
    if (!imported) return imported.error();
    for (const std::string& warning : imported->warnings) {
        std::fprintf(stderr, "%s\n", warning.c_str());
    }
    return {};
}

}  // namespace replay
