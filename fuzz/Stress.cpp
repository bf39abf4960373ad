/**
 * Calls everything that a trace can call, at random and from eight threads at once, in real time:
 * food for the sanitizers. The argument is the number of calls of each thread.
 *
 * Before that, the threads race on the flag of the end of the boot and on names that grow. At the
 * end they race on the flag that ends the worker.
 */

#include <cstdio>
#include <cstdlib>
#include <random>
#include <thread>

#include <android/log.h>

#include "core/SensorHandlerThread.h"
#include "core/TallyCommon.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "trace/CallTable.h"
#include "usage/MagneticUseIf.h"

extern "C" const trace::CallModule* sensor_replay_calls();

namespace trace {
namespace {

constexpr int kThreads = 8;
constexpr size_t kMaxNameBytes = 100'000;
constexpr int kUltraEnabled = 3;

using Random = std::mt19937;

int32_t pick(Random& random, std::initializer_list<int32_t> values) {
    return values.begin()[random() % values.size()];
}

template <typename T>
T make(Random& random) {
    if constexpr (std::is_same_v<T, std::string>) {
        constexpr const char* kNames[] = {"", "com.example.a", "com.example.b", "com.tencent.mm",
                                          "com.android.server.display.DisplayPowerController"};
        const size_t index = random() % (std::size(kNames) + 1);
        return index < std::size(kNames) ? kNames[index]
                                         : std::string(random() % (kMaxNameBytes + 1), 'x');
    } else if constexpr (std::is_same_v<T, IntList>) {
        IntList list(random() % 14);
        for (int32_t& value : list) value = pick(random, {0, 1, 2, 3, 7, 10});
        return list;
    } else if constexpr (std::is_same_v<T, Rectangle>) {
        return {0, 0, pick(random, {0, 3, 16}), pick(random, {0, 4, 16})};
    } else if constexpr (std::is_same_v<T, sensors_event_t>) {
        sensors_event_t event{};
        event.type = pick(random, {1, 5, 8});
        for (float& value : event.data) value = static_cast<float>(pick(random, {0, 5, 301, 302}));
        return event;
    } else if constexpr (std::is_same_v<T, android::UltraExceptionInfo>) {
        return {make<std::string>(random), pick(random, {0, 1})};
    } else if constexpr (std::is_same_v<T, bool>) {
        return random() % 2 != 0;
    } else {
        // Sensor types, hours, message codes, states, rates: small numbers do for all of them.
        return static_cast<T>(random() % 37);
    }
}

template <typename... Types>
std::vector<Argument> makeAll(Random& random, std::tuple<Types...>*) {
    return {Argument(make<Types>(random))...};
}

template <typename Operation>
std::vector<Argument> makeArguments(Random& random) {
    return makeAll(random, static_cast<typename ArgumentsOf<Operation>::type*>(nullptr));
}

constexpr std::vector<Argument> (*kArguments[])(Random&) = {
#define CALL(Class, operation, parameters) makeArguments<decltype(&android::Class::operation)>,
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

void run(unsigned seed, int calls) {
    Random random(seed);
    android::TallyCommon::getInstance()->BootNotFinish();
    const CallModule* library = sensor_replay_calls();
    for (int i = 0; i < calls; ++i) {
        const size_t index = random() % std::size(kArguments);
        library->call(index, kArguments[index](random));
    }
}

/** Names that grow, told and read at once: a text whose storage moves would be read when freed. */
void growNames(unsigned seed) {
    android::UltraException* ultra = android::UltraException::getInstance();
    android::MagneticUseIf* orientation = android::MagneticUseIf::getInstance();
    for (size_t bytes = seed; bytes < kMaxNameBytes; bytes += 500) {
        const std::string name(bytes, 'x');
        ultra->doAction(kUltraEnabled, {name, 0});
        ultra->trackEvent(name, 0, 0);
        orientation->setOrientationEnable("", "");
        orientation->setOrientationDisable(name, "");
    }
}

template <typename Work>
void inAllThreads(Work work) {
    std::vector<std::thread> threads;
    for (unsigned seed = 0; seed < kThreads; ++seed) threads.emplace_back(work, seed);
    for (std::thread& thread : threads) thread.join();
}

}  // namespace
}  // namespace trace

int main(int argc, char** argv) {
    const int calls = argc > 1 ? std::atoi(argv[1]) : 10'000;
    __android_log_set_logger([](const __android_logger_data*, const char*) {});
    platform::observeEvents([](const char*, const char*, const char*) {});
    mLogSwitch = 1;
    platform::setDeviceProperty("service.bootanim.exit", "1");
    trace::inAllThreads(trace::growNames);
    trace::inAllThreads([calls](unsigned seed) { trace::run(seed, calls); });
    trace::inAllThreads([](unsigned) { android::SensorHandlerThread::getInstance()->quit(); });
    android::SensorHandlerThread::getInstance()->join();
    std::printf("%d threads made %d calls each\n", trace::kThreads, calls);
}
