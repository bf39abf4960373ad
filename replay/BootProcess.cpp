#include "replay/BootProcess.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <new>
#include <string_view>

#include <poll.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "platform/PropertyService.h"
#include "replay/OneProcessor.h"

namespace replay {

using report::Record;
using trace::BootKind;
using trace::Failure;
using trace::kStatusFailed;

namespace {

constexpr int kIdleMs = 200;  // between two calls of `idle` while nothing comes

/** Plays the boot in this process; its last record is one that no report gets. */
void playAndTell(const Boot& boot, const trace::TraceLine* first, const Device& device,
                 const Channels& channels) {
    std::optional<Failure> failure;
    if (device.propertyFile) {
        if (const auto error = platform::openProperties(*device.propertyFile)) {
            failure = Failure{*error};
        }
    } else if (!device.properties.empty()) {
        const auto* begin = reinterpret_cast<const unsigned char*>(device.properties.data());
        platform::restoreProperties({begin, begin + device.properties.size()});
    }
    NextBoot next;
    try {
        if (!failure) next = play(boot, first, channels, &failure);
    } catch (const std::bad_alloc&) {
        const trace::TraceReader& reader = *channels.reader;
        failure = Failure{trace::at(reader.name(), reader.lineNumber()) + "not enough memory",
                          kStatusFailed};
    }
    std::vector<unsigned char> bytes;
    if (device.propertyFile) {
        const auto error = platform::closeProperties();
        if (error && !failure) failure = Failure{*error};
    } else {
        bytes = platform::saveProperties();
    }
    const std::string_view properties(reinterpret_cast<const char*>(bytes.data()), bytes.size());
    if (failure) {
        channels.records->add({Record::Kind::kFailure, 0, failure->status, {failure->text}});
    } else if (next) {
        channels.records->add(
                {Record::Kind::kNextBoot, next->at, 0, {bootName(next->kind), properties}});
    } else {
        channels.records->add({Record::Kind::kEnd, 0, 0, {"", properties}});
    }
    channels.records->flush();
}

/** Takes what a process leaves to the tool. */
class Legacy {
public:
    Legacy(Device* device, std::optional<Failure>* failure) : mDevice(device), mFailure(failure) {}

    NextBoot next;
    bool isThere = false;

    /** Whether `record` was one for the tool. */
    bool take(const Record& record) {
        if (record.kind < Record::Kind::kNextBoot) return false;
        isThere = true;
        if (record.kind == Record::Kind::kFailure) {
            *mFailure = Failure{std::string(record.texts[0]), static_cast<int>(record.number)};
            return true;
        }
        mDevice->properties = record.texts[1];
        if (record.kind == Record::Kind::kNextBoot) {
            const bool isDevice = record.texts[0] == bootName(BootKind::kDevice);
            next = Boot{isDevice ? BootKind::kDevice : BootKind::kProcess, record.at};
        }
        return true;
    }

private:
    Device* const mDevice;
    std::optional<Failure>* const mFailure;
};

/** Reads records until the process has none left. */
void readRecords(int fd, const std::function<void(const Record&)>& take,
                 const std::function<void()>& idle) {
    report::RecordReader reader;
    std::vector<char> block(size_t{64} << 10);
    for (;;) {
        pollfd ready{fd, POLLIN, 0};
        for (int waitMs = 0; poll(&ready, 1, waitMs) == 0; waitMs = kIdleMs) idle();
        const ssize_t count = read(fd, block.data(), block.size());
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return;
        reader.take(block.data(), static_cast<size_t>(count), take);
    }
}

/** Waits for the process; why it died, if it did without a last word. */
std::optional<Failure> waitFor(pid_t child, const trace::TraceReader& reader) {
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR) {}
    const std::string place = trace::at(reader.name(), reader.lineNumber());
    if (WIFSIGNALED(status)) {
        return Failure{
                place + "the process died here or just before: " + strsignal(WTERMSIG(status)),
                kStatusFailed};
    }
    return Failure{place + "the process ended here or just before", kStatusFailed};
}

}  // namespace

NextBoot runBoot(const Boot& boot, const trace::TraceLine* first, bool recordsCalls, Device* device,
                 trace::TraceReader* reader, const std::function<void(const Record&)>& take,
                 const std::function<void()>& idle, std::optional<Failure>* failure) {
    const auto fail = [&](const char* what) {
        *failure = Failure{std::string(what) + std::strerror(errno), kStatusFailed};
        return NextBoot();
    };
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) return fail("cannot make a pipe: ");
    OneProcessor processor;
    const pid_t tool = getpid();
    const pid_t child = fork();
    if (child == 0) {
        processor.letGo();
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (getppid() != tool) _exit(kStatusFailed);
        close(ends[0]);
        report::RecordWriter records(ends[1]);
        playAndTell(boot, first, *device, {reader, &records, recordsCalls});
        _exit(0);
    }
    close(ends[1]);
    Legacy legacy(device, failure);
    if (child > 0) {
        readRecords(
                ends[0],
                [&](const Record& record) {
                    if (!legacy.take(record)) take(record);
                },
                idle);
    }
    close(ends[0]);
    if (child < 0) return fail("cannot start a process: ");
    const auto death = waitFor(child, *reader);
    if (!legacy.isThere) *failure = death;
    return legacy.next;
}

}  // namespace replay
