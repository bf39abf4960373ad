#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>

#include <android/log.h>
#include <benchmark/benchmark.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <unistd.h>

#include "core/SDCImpl.h"
#include "exception/FlowingDataException.h"
#include "platform/Telemetry.h"
#include "rgb/RgbShotManager.h"

namespace {

using android::FlowingDataException;
using android::RgbShotManager;
using android::SDCImpl;

/** Records into a folder of this process's own, which goes with it. */
class Folder {
public:
    Folder() {
        const char* const parent = std::getenv("TMPDIR");
        mPath = std::string(parent != nullptr ? parent : "/tmp") + "/record-bench-XXXXXX";
        setenv("SENSOR_PRIV_RECORD", mkdtemp(mPath.data()), 1);
        __android_log_set_logger([](const __android_logger_data*, const char*) {});
        platform::observeEvents([](const char*, const char*, const char*) {});
    }
    ~Folder() { std::filesystem::remove_all(mPath); }

private:
    std::string mPath;
} gFolder;

/** The library's own function of the name that the recorder's function at `address` has. */
template <typename Function, typename Operation>
Function direct(Operation operation) {
    const void* address = nullptr;
    std::memcpy(&address, &operation, sizeof(address));
    Dl_info info{};
    dladdr(address, &info);
    return reinterpret_cast<Function>(dlsym(dlopen("libsensor-priv.so", RTLD_NOW), info.dli_sname));
}

/** Holds, or no longer holds, the proximity sensor, as an app that the library does not watch. */
void holdProximity(bool holds) {
    SDCImpl::getInstance()->enableSuccess(holds, 8, "com.example.app", "com.example.app", 0);
}

sensors_event_t reading() {
    sensors_event_t event{};
    event.type = 1;
    event.data[0] = 0.1532F;
    event.data[1] = 9.80665F;
    event.data[2] = -0.40218F;
    return event;
}

/** What the kernel takes of it: a line of the usual length, into a file of the same kind. */
void writeAlone(benchmark::State& state) {
    const std::string path = std::string(std::getenv("SENSOR_PRIV_RECORD")) + "/peer";
    const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_APPEND, 0600);
    const std::string line(100, 'x');
    for (auto _ : state) benchmark::DoNotOptimize(write(fd, line.data(), line.size()));
    close(fd);
    unlink(path.c_str());
}

void processDirect(benchmark::State& state) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    const auto process = direct<void (*)(SDCImpl*, const sensors_event_t&)>(&SDCImpl::process);
    const sensors_event_t event = reading();
    for (auto _ : state) process(sdc, event);
}

void processNotRecorded(benchmark::State& state) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    holdProximity(false);
    const sensors_event_t event = reading();
    for (auto _ : state) sdc->process(event);
}

void processRecorded(benchmark::State& state) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    holdProximity(true);
    const sensors_event_t event = reading();
    for (auto _ : state) sdc->process(event);
    holdProximity(false);
}

void skipLuxRecorded(benchmark::State& state) {
    RgbShotManager* const manager = RgbShotManager::getInstance();
    for (auto _ : state) benchmark::DoNotOptimize(manager->skipLux());
}

void testModeDirect(benchmark::State& state) {
    RgbShotManager* const manager = RgbShotManager::getInstance();
    const auto read = direct<void (*)(RgbShotManager*)>(&RgbShotManager::isTestMode);
    for (auto _ : state) read(manager);
}

void testModeRecorded(benchmark::State& state) {
    RgbShotManager* const manager = RgbShotManager::getInstance();
    for (auto _ : state) manager->isTestMode();
}

void sendDirect(benchmark::State& state) {
    FlowingDataException* const exception = FlowingDataException::getInstance();
    const auto send = direct<void (*)(FlowingDataException*, int, int)>(
            &FlowingDataException::setSensorException);
    for (auto _ : state) send(exception, 1, 3);
}

void sendRecorded(benchmark::State& state) {
    FlowingDataException* const exception = FlowingDataException::getInstance();
    for (auto _ : state) exception->setSensorException(1, 3);
}

const std::string kName = "com.example.application.with.a.usual.name";

void enableDirect(benchmark::State& state) {
    using Function =
            void (*)(SDCImpl*, bool, int, const std::string&, const std::string&, long long);
    SDCImpl* const sdc = SDCImpl::getInstance();
    const auto enable = direct<Function>(&SDCImpl::enableSuccess);
    for (auto _ : state) enable(sdc, true, 4, kName, kName, 20000);
}

void enableRecorded(benchmark::State& state) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    for (auto _ : state) sdc->enableSuccess(true, 4, kName, kName, 20000);
}

void clockDirect(benchmark::State& state) {
    using Function = int (*)(clockid_t, timespec*);
    const auto read = reinterpret_cast<Function>(
            dlsym(dlopen("libc.so.6", RTLD_NOW | RTLD_NOLOAD), "clock_gettime"));
    timespec now{};
    for (auto _ : state) benchmark::DoNotOptimize(read(CLOCK_MONOTONIC, &now));
}

void clockBehindRecorder(benchmark::State& state) {
    timespec now{};
    for (auto _ : state) benchmark::DoNotOptimize(clock_gettime(CLOCK_MONOTONIC, &now));
}

BENCHMARK(clockDirect);
BENCHMARK(clockBehindRecorder);
BENCHMARK(writeAlone);
BENCHMARK(processDirect);
BENCHMARK(processNotRecorded);
BENCHMARK(processRecorded);
BENCHMARK(skipLuxRecorded);
BENCHMARK(testModeDirect);
BENCHMARK(testModeRecorded);
BENCHMARK(sendDirect);
BENCHMARK(sendRecorded);
BENCHMARK(enableDirect);
BENCHMARK(enableRecorded);

}  // namespace
