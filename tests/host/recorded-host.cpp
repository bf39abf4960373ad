/**
 * Hosts that go wrong in one way each, as the first argument says, with the recorder in front of
 * the library. RecordedHostTest runs them and reads what they have left. Each prints what it has
 * seen.
 */

#include <atomic>
#include <cerrno>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <future>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>

#include <android/log.h>
#include <cutils/properties.h>
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#include "core/SDCImpl.h"
#include "core/SensorHandlerThread.h"
#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "platform/Telemetry.h"
#include "rgb/LightSensorState.h"
#include "rgb/RgbShotManager.h"

namespace {

using namespace android;

/** What telemetry does, on the thread that sends. */
std::function<void(const std::string& id)> gTelemetry = [](const std::string&) {};

/** The next write to the record takes half of its bytes. */
std::atomic<bool> gTakesHalf{false};

/** Sends the event N273|10004 on this thread. */
void report() {
    FlowingDataException::getInstance()->setSensorException(1, 3);
}

void enable(bool on, int type, const std::string& pkg, const std::string& opPkg) {
    SDCImpl::getInstance()->enableSuccess(on, type, pkg, opPkg, 20000);
}

int64_t realMs() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC_RAW, &now);
    return int64_t{now.tv_sec} * 1000 + now.tv_nsec / 1'000'000;
}

void passMs(int64_t ms) {
    for (const int64_t end = realMs() + ms; realMs() < end;) usleep(1000);
}

/** Waits until the worker has ended the message that it is in. */
void letMessageEnd() {
    struct Signal : MessageHandler {
        void handleMessage(const Message&) override { isReached.set_value(); }
        std::promise<void> isReached;
    };
    const sp<Signal> signal = new Signal;
    SensorHandlerThread::getInstance()->sendMessage(signal, 0);
    signal->isReached.get_future().wait();
}

std::string recordPath() {
    return std::string(std::getenv("SENSOR_PRIV_RECORD")) + "/sensor-priv.jsonl";
}

off_t recordSize() {
    struct stat status {};
    return stat(recordPath().c_str(), &status) == 0 ? status.st_size : -1;
}

/** Runs `meanwhile` while what `call` brings about hangs in telemetry. */
void hangWhile(const std::function<void()>& meanwhile, void (*call)() = report) {
    struct State {
        std::mutex mutex;
        std::condition_variable changed;
        bool hangs = false;
        bool isOver = false;
    };
    // Held by telemetry: the worker may still be in it when this returns.
    const auto state = std::make_shared<State>();
    gTelemetry = [state](const std::string&) {
        std::unique_lock lock(state->mutex);
        if (std::exchange(state->hangs, true)) return;
        state->changed.notify_all();
        state->changed.wait(lock, [&] { return state->isOver; });
    };
    std::thread caller(call);
    {
        std::unique_lock lock(state->mutex);
        state->changed.wait(lock, [&] { return state->hangs; });
    }
    meanwhile();
    {
        const std::lock_guard lock(state->mutex);
        state->isOver = true;
    }
    state->changed.notify_all();
    caller.join();
}

void hang() {
    hangWhile([] {
        const auto now = [] { return RgbShotManager::getInstance()->getCurrentMs(); };
        passMs(20);
        const int64_t before = realMs();
        const auto begin = now();
        const int64_t from = realMs();
        passMs(300);
        const int64_t to = realMs();
        const auto seen = now() - begin;
        const bool goes = seen >= to - from - 5 && seen <= realMs() - before + 5;
        std::printf("the clock goes: %s\n", goes ? "yes" : "no");
    });
}

/** More than is held back meanwhile. */
void hangLong() {
    hangWhile([] {
        for (int i = 0; i < 4000; ++i) report();
        std::printf("written meanwhile: %s\n", recordSize() > 200'000 ? "yes" : "no");
    });
}

/** The file may not grow for the time of one call, and is longer than files may be. */
void full() {
    report();
    rlimit limit{};
    getrlimit(RLIMIT_FSIZE, &limit);
    const rlim_t usual = std::exchange(limit.rlim_cur, static_cast<rlim_t>(recordSize()) - 1);
    setrlimit(RLIMIT_FSIZE, &limit);
    report();
    limit.rlim_cur = usual;
    setrlimit(RLIMIT_FSIZE, &limit);
    report();
}

/** A message has not done all when lines are lost, and does the rest when the record goes on. */
void losesWhileAMessageHangs() {
    hangWhile(full, [] { UltraException::getInstance()->doAction(4, {}); });
    letMessageEnd();
}

/** The file may not grow any more. */
void fullToTheEnd() {
    report();
    rlimit limit{};
    getrlimit(RLIMIT_FSIZE, &limit);
    limit.rlim_cur = static_cast<rlim_t>(recordSize()) + 1100;
    setrlimit(RLIMIT_FSIZE, &limit);
    for (int i = 0; i < 9; ++i) report();
}

/** The disk takes half of a line. */
void halfWritten() {
    report();
    gTakesHalf = true;
    report();
    report();
}

void removed() {
    report();
    unlink(recordPath().c_str());
    report();
}

/** The descriptor of the record in this process; 64 if there is none. */
int recordFd() {
    struct stat record {};
    struct stat open {};
    stat(recordPath().c_str(), &record);
    int fd = 0;
    while (fd < 64 && (fstat(fd, &open) != 0 || open.st_ino != record.st_ino)) ++fd;
    return fd;
}

/**
 * In telemetry the host closes what it does not know, and opens something else. Then the library
 * stores what it has counted.
 */
void closes() {
    property_set("persist.zuno.flow.detect.count", "0,7,0,0,0,0");
    FlowingDataException::getInstance()->notifyBootCompleted();
    static std::promise<int> opened;
    gTelemetry = [isOpen = false](const std::string&) mutable {
        if (std::exchange(isOpen, true)) return;
        close(recordFd());
        opened.set_value(open("own", O_RDWR | O_CREAT | O_APPEND, 0600));
    };
    SDCImpl::getInstance()->notifySdcClock(8);
    const int own = opened.get_future().get();
    letMessageEnd();
    report();
    struct stat status {};
    fstat(own, &status);
    std::printf("own file: %d bytes\n", static_cast<int>(status.st_size));
}

void forks() {
    report();
    const pid_t child = fork();
    if (child == 0) {
        report();
        report();
        _exit(recordFd() < 64 ? 1 : 0);
    }
    int status = 0;
    waitpid(child, &status, 0);
    report();
    std::printf("has the record: %d, its child: %d\n", recordFd() < 64, WEXITSTATUS(status));
}

/** While other threads call and send, too. */
void forksInTelemetry() {
    std::atomic<bool> isOver{false};
    std::atomic<int> children{0};
    std::thread others[2];
    for (std::thread& other : others) {
        other = std::thread([&] {
            while (!isOver) enable(true, 4, "com.example.a", "com.example.b");
        });
    }
    bool isChild = false;
    gTelemetry = [&](const std::string&) {
        const pid_t child = fork();
        isChild = child == 0;
        if (isChild) alarm(20);
        int status = 1;
        if (!isChild && waitpid(child, &status, 0) == child && status == 0) ++children;
    };
    for (int i = 0; i < 20; ++i) {
        report();
        if (isChild) _exit(0);
    }
    isOver = true;
    for (std::thread& other : others) other.join();
    std::printf("children: %d\n", children.load());
}

void callsFromLog() {
    static thread_local bool tIsLogging = false;
    __android_log_set_logger([](const __android_logger_data*, const char*) {
        if (std::exchange(tIsLogging, true)) return;
        RgbShotManager::getInstance()->skipLux();
        tIsLogging = false;
    });
    report();
    RgbShotManager::getInstance()->isTestMode();
    __android_log_set_logger([](const __android_logger_data*, const char*) {});
}

void callsFromTelemetry() {
    gTelemetry = [](const std::string&) {
        property_set("persist.zuno.rgb.shot.count", "77");
        RgbShotManager::getInstance()->onTouchChange();
    };
    report();
}

/** Names that are hard to replace, in a list that is reported. */
void names() {
    const std::string odd[] = {"1",
                               "a/b",
                               "quote\"back\\slash",
                               "\xC3\xA4\xE2\x82\xAC\xF0\x9F\x98\x80",
                               "tab\tline\n",
                               "secret-bad\xFF\xC3",
                               std::string("secret-nul\0secret-end", 21),
                               "&time:2&pkg:secret"};
    for (const std::string& name : odd) {
        for (const std::string& opPkg : {name, std::string("com.example")}) {
            enable(true, 3, name, opPkg);
            enable(false, 3, name, opPkg);
        }
    }
    static std::promise<void> sent;
    gTelemetry = [](const std::string& id) {
        if (id == "N273|10012") sent.set_value();
    };
    SDCImpl::getInstance()->notifySdcClock(23);
    sent.get_future().wait();
    letMessageEnd();
}

void leavesItsFolder() {
    policy = 7;  // the program holds this variable itself
    if (chdir("/") != 0) std::perror("/");
    report();
}

/** Until it is killed. */
void calls() {
    for (int i = 0;; ++i) {
        enable(i % 2 == 0, 1, "com.example.application.with.a.name" + std::to_string(i % 9),
               "com.example");
        if (i % 5 == 0) report();
    }
}

const std::map<std::string, void (*)()> kHosts{
        {"hang", hang},
        {"hang-long", hangLong},
        {"full", full},
        {"full-to-the-end", fullToTheEnd},
        {"half-written", halfWritten},
        {"removed", removed},
        {"closes", closes},
        {"forks", forks},
        {"forks-in-telemetry", forksInTelemetry},
        {"calls-from-log", callsFromLog},
        {"calls-from-telemetry", callsFromTelemetry},
        {"loses-while-a-message-hangs", losesWhileAMessageHangs},
        {"names", names},
        {"leaves-its-folder", leavesItsFolder},
        {"calls", calls},
};

}  // namespace

/** What the recorder finds before that of the system. */
extern "C" ssize_t write(int fd, const void* bytes, size_t count) {
    return syscall(SYS_write, fd, bytes, fd > 2 && gTakesHalf.exchange(false) ? count / 2 : count);
}

int main(int count, char** values) {
    const auto host = kHosts.find(count > 1 ? values[1] : "");
    if (host == kHosts.end()) return 2;
    platform::observeEvents([](const char*, const char* id, const char*) { gTelemetry(id); });
    host->second();
    std::fflush(nullptr);
    _exit(0);  // the library's worker lives as long as the process
}
