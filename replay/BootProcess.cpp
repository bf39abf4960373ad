#include "replay/BootProcess.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <new>
#include <string_view>
#include <utility>
#include <vector>

#include <poll.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/FileIo.h"
#include "platform/PropertyService.h"
#include "replay/OneProcessor.h"

namespace replay {

using base::Failure;
using base::kStatusFailed;
using trace::BootKind;
using trace::Record;

namespace {

constexpr int kIdleMs = 200;  // between two calls of `idle` while nothing comes

base::Result<void> openStore(const Device& device) {
    if (device.propertyFile) {
        if (const auto error = platform::openProperties(*device.propertyFile)) {
            return base::fail(*error);
        }
    } else if (!device.properties.empty()) {
        const auto* begin = reinterpret_cast<const unsigned char*>(device.properties.data());
        platform::restoreProperties({begin, begin + device.properties.size()});
    }
    return {};
}

/** Plays the boot in this process. */
base::Result<NextBoot> playHere(const Boot& boot, const trace::TraceLine* first,
                                const Device& device, const Channels& channels) {
    try {
        return openStore(device).and_then([&] { return play(boot, first, channels); });
    } catch (const std::bad_alloc&) {
        const trace::TraceReader& reader = *channels.reader;
        return base::fail(base::at(reader.name(), reader.lineNumber()) + "not enough memory",
                          kStatusFailed);
    }
}

/** Plays the boot in this process; its last record is one that no report gets. */
void playAndTell(const Boot& boot, const trace::TraceLine* first, const Device& device,
                 const Channels& channels) {
    auto next = playHere(boot, first, device, channels);
    std::vector<unsigned char> bytes;
    if (device.propertyFile) {
        const auto error = platform::closeProperties();
        if (error && next) next = base::fail(*error);
    } else {
        bytes = platform::saveProperties();
    }
    const std::string_view properties(reinterpret_cast<const char*>(bytes.data()), bytes.size());
    if (!next) {
        const Failure& failure = next.error();
        channels.records->add({Record::Kind::kFailure, 0, {failure.text}, failure.status});
    } else if (const NextBoot& after = *next) {
        channels.records->add({Record::Kind::kNextBoot,
                               after->at,
                               {after->note, properties},
                               0,
                               static_cast<int32_t>(after->kind)});
    } else {
        channels.records->add({Record::Kind::kEnd, 0, {"", properties}});
    }
    channels.records->flush();
}

/** What a process leaves to the tool in its last record; nothing if `record` is none such. */
std::optional<base::Result<NextBoot>> takeLast(const Record& record, Device* device) {
    const auto& [first, properties, third] = record.texts;
    switch (record.kind) {
        case Record::Kind::kFailure:
            return base::fail(std::string(first), static_cast<int>(record.number));
        case Record::Kind::kEnd:
            device->properties = properties;
            return NextBoot();
        case Record::Kind::kNextBoot:
            device->properties = properties;
            return Boot{static_cast<BootKind>(record.value), record.at, std::string(first)};
        default:
            return std::nullopt;
    }
}

/** Reads records until the process has none left. */
void readRecords(int fd, const Listener& listener) {
    trace::RecordReader reader;
    std::vector<char> block(size_t{64} << 10);
    for (;;) {
        pollfd ready{fd, POLLIN, 0};
        for (int waitMs = 0; poll(&ready, 1, waitMs) == 0; waitMs = kIdleMs) listener.idle();
        const ssize_t count = read(fd, block.data(), block.size());
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return;
        reader.take(block.data(), static_cast<size_t>(count), listener.take);
    }
}

/** Waits for the process; why it died, if it did without a last word. */
Failure waitFor(pid_t child, const trace::TraceReader& reader) {
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR) {}
    const std::string place = base::at(reader.name(), reader.lineNumber());
    if (WIFSIGNALED(status)) {
        return Failure{
                place + "the process died here or just before: " + strsignal(WTERMSIG(status)),
                kStatusFailed};
    }
    return Failure{place + "the process ended here or just before", kStatusFailed};
}

}  // namespace

base::Result<NextBoot> runBoot(const Boot& boot, const trace::TraceLine* first,
                               trace::WantedRecords wanted, Device* device,
                               trace::TraceReader* reader, const Listener& listener) {
    const auto cannot = [](const std::string& what) {
        return base::fail("cannot " + what + ": " + std::strerror(errno), kStatusFailed);
    };
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) return cannot("make a pipe");
    OneProcessor processor;
    const pid_t tool = getpid();
    const pid_t child = fork();
    if (child == 0) {
        processor.letGo();
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (getppid() != tool) _exit(kStatusFailed);
        close(ends[0]);
        // Ends with the tool, which reads it.
        trace::RecordWriter records([fd = ends[1]](std::string_view bytes) {
            if (!base::writeAll(fd, bytes.data(), bytes.size())) _exit(kStatusFailed);
        });
        playAndTell(boot, first, *device, {reader, &records, wanted});
        _exit(0);
    }
    close(ends[1]);
    if (child < 0) {
        auto failure = cannot("start a process");
        close(ends[0]);
        return failure;
    }
    std::optional<base::Result<NextBoot>> last;
    const auto take = [&](const Record& record) {
        last = takeLast(record, device);
        if (!last) listener.take(record);
    };
    readRecords(ends[0], {take, listener.idle});
    close(ends[0]);
    const Failure death = waitFor(child, *reader);
    return last ? *last : tl::unexpected(death);
}

}  // namespace replay
