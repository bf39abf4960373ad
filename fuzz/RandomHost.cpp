/**
 * A host that does at random, from several threads and in real time, what a sensor service does.
 * The recorder stands in front of the library: its record has to replay to what happened.
 * Arguments: a seed, seconds to live, and a file for the properties, which makes a process the
 * next boot of the one before.
 */

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include <android/log.h>
#include <unistd.h>

#include "core/SDCImpl.h"
#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "rgb/LightSensorState.h"
#include "rgb/RgbShotManager.h"

namespace {

using namespace android;
using Clock = std::chrono::steady_clock;

constexpr const char* kApps[] = {"com.example.game", "com.example.map", "com.example.run",
                                 "com.tencent.mm", "com.android.incallui"};

/** One thread's dice and its end. */
class Life {
public:
    Life(unsigned seed, Clock::time_point end) : mRandom(seed), mEnd(end) {}

    int pick(int count) { return static_cast<int>(mRandom() % static_cast<unsigned>(count)); }
    std::string app() { return kApps[pick(std::size(kApps))]; }

    /** Mostly milliseconds, now and then nothing at all; false when life is over. */
    bool wait() {
        if (pick(4) != 0) std::this_thread::sleep_for(std::chrono::microseconds(pick(20'000)));
        return Clock::now() < mEnd;
    }

private:
    std::mt19937 mRandom;
    const Clock::time_point mEnd;
};

void enable(bool on, int type, const std::string& app, int rate) {
    SDCImpl::getInstance()->enableSuccess(on, type, app + ".Listener", app, on ? rate : 0);
}

/** A few clients, each with sensors of its own. */
void useSensors(Life* life) {
    constexpr int kTypes[] = {1, 3, 4, 8, 11, 16, 35};
    while (life->wait()) {
        const int type = kTypes[life->pick(std::size(kTypes))];
        const std::string app = life->app();
        if (life->pick(8) != 0) {
            enable(life->pick(2) == 0, type, app, 1000 * (1 + life->pick(3)));
        } else {
            const String8 name(app.c_str());
            SDCImpl::getInstance()->cleanupConnection(name, name, type);
        }
    }
}

/** The chat application with the phone at the ear, at 50 readings a second. */
void chat(Life* life) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    Vector<int> voice;
    voice.insertAt(0, 0, 8);
    voice.editItemAt(0) = 7;
    voice.editItemAt(7) = 1;
    sdc->setNotification(voice);
    do {
        enable(true, 8, "com.tencent.mm", 0);
        for (int i = 0; i < 60; ++i) {
            sensors_event_t event{};
            event.type = i % 25 == 0 ? 8 : 1;
            if (event.type == 8) event.data[0] = i % 50 == 0 ? 5 : 0;
            for (float& value : event.data) {
                if (event.type == 1) value = static_cast<float>(life->pick(2000)) / 97;
            }
            sdc->process(event);
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
        }
        enable(false, 8, "com.tencent.mm", 0);
    } while (life->wait());
}

void watchDevice(Life* life) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    FlowingDataException::getInstance()->notifyBootCompleted();
    sdc->sendBootShutdownRebootState(1);
    for (int days = 0; life->wait();) {
        Vector<int> display;
        display.push_back(2);
        display.push_back(0);
        display.push_back(1 + life->pick(2));
        switch (life->pick(5)) {
            case 0:
                sdc->setNotification(display);
                break;
            case 1:
                sdc->sendChargeState(life->pick(4));
                break;
            case 2:
                sdc->sendUsedTime(++days);
                break;
            case 3:
                FlowingDataException::getInstance()->notifyPutTally(10 + life->pick(6));
                break;
            default:
                FlowingDataException::getInstance()->notifyUpdateDetectCount(1 + life->pick(12));
                break;
        }
    }
    sdc->sendBootShutdownRebootState(0);
}

/** Reports, and some milliseconds later resets, as docs/integrating.md asks for. */
void passHours(Life* life) {
    SDCImpl* const sdc = SDCImpl::getInstance();
    for (int hour = life->pick(24); life->wait(); hour = (hour + 1) % 24) {
        sdc->notifySdcClock(hour);
        sdc->putRgbShotTally(hour);
        sdc->putPhoneOpenUltraTally(hour);
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        sdc->notifySdcReset(hour);
        sdc->notifyRgbShotReset(hour);
        sdc->notifyUltraReset(hour);
    }
}

void phone(Life* life) {
    UltraException* const ultra = UltraException::getInstance();
    while (life->wait()) {
        sensors_event_t event{};
        event.data[3] = static_cast<float>(301 + life->pick(2));
        event.data[4] = static_cast<float>(life->pick(1000));
        if (life->pick(4) == 0) ultra->setUltraEnergy(event);
        ultra->doAction(2 + life->pick(5), {life->app(), life->pick(2)});
    }
}

void sample(Life* life) {
    RgbShotManager* const rgb = RgbShotManager::getInstance();
    while (life->wait()) {
        policy = life->pick(3);
        if (life->pick(3) == 0) rgb->onTouchChange();
        if (life->pick(5) == 0) rgb->policyChange();
        if (life->pick(9) == 0) rgb->onTransitionStatusChange(life->pick(2));
        platform::DisplayChange change;
        change.color = platform::Color{static_cast<uint8_t>(life->pick(256)), 10, 20};
        change.fault =
                life->pick(5) == 0 ? platform::DisplayFault::kToken : platform::DisplayFault::kNone;
        platform::changeDisplay(change);
        int average[3];
        int rect[] = {0, 0, 8, 8};
        if (rgb->allowRgbShot()) rgb->getScreenPixcel(average, rect);
    }
}

void live(unsigned seed, std::chrono::milliseconds length) {
    SDCImpl::getInstance();
    const Clock::time_point end = Clock::now() + length;
    std::vector<std::thread> threads;
    const std::function<void(Life*)> kParts[] = {useSensors, useSensors, chat,  watchDevice,
                                                 passHours,  phone,      sample};
    for (const auto& part : kParts) {
        threads.emplace_back([part, end, own = ++seed * 7919] {
            Life life(own, end);
            part(&life);
        });
    }
    for (std::thread& thread : threads) thread.join();
    std::this_thread::sleep_for(std::chrono::milliseconds(100));  // what was posted last
}

}  // namespace

int main(int count, char** values) {
    if (count < 3) {
        std::fprintf(stderr, "usage: %s SEED MILLISECONDS [PROPERTIES]\n", values[0]);
        return 2;
    }
    __android_log_set_logger([](const __android_logger_data*, const char*) {});
    platform::observeEvents([](const char*, const char*, const char*) {});
    if (count > 3) {
        if (const auto error = platform::openProperties(values[3])) {
            std::fprintf(stderr, "%s\n", error->c_str());
            return 1;
        }
    }
    live(static_cast<unsigned>(std::atoi(values[1])),
         std::chrono::milliseconds(std::atoi(values[2])));
    std::fflush(nullptr);
    _exit(0);  // the library's worker lives as long as the process
}
