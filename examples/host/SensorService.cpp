#include "examples/host/SensorService.h"

#include <algorithm>
#include <cstdio>
#include <thread>
#include <utility>

#include "core/SDCImpl.h"
#include "core/SensorHandlerThread.h"
#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "rgb/RgbShotManager.h"

namespace host {

using android::FlowingDataException;
using android::RgbShotManager;
using android::SDCImpl;
using android::SensorHandlerThread;
using android::UltraException;
using namespace std::chrono_literals;

namespace {

/** The sensor type of the ultrasonic energies. Device: the type that its sensor list gives them. */
constexpr int kUltraEnergy = 0x10001;

constexpr int kDisplayNotification = 2;
constexpr int kDisplayOn = 2;

/** A turn of the sampling loop that was allowed no sample. */
constexpr auto kTurn = 50ms;

/** The pixels above the light sensor: left, top, right, bottom. Device: from its configuration. */
constexpr int kSampleArea[] = {508, 20, 572, 84};

}  // namespace

/** Waits at the end of the queue of the library's worker. */
class SensorService::WorkerQueue : public android::MessageHandler {
public:
    /** Blocks until the worker has run all that is due. */
    void wait() {
        std::unique_lock lock(mMutex);
        SensorHandlerThread::getInstance()->sendMessage(this, 0);
        const int mine = ++mPosted;
        mChanged.wait(lock, [this, mine] { return mRun >= mine; });
    }

private:
    void handleMessage(const android::Message&) override {
        const std::lock_guard lock(mMutex);
        ++mRun;
        mChanged.notify_all();
    }

    std::mutex mMutex;
    std::condition_variable mChanged;
    int mPosted = 0;  // guarded by mMutex, as the next one
    int mRun = 0;
};

// The library is created whole at the service's start: a module loads its stored counters 2 s after
// its creation, and what it has counted by then may be lost.
SensorService::SensorService()
      : mSdc(SDCImpl::getInstance()),
        mFlowingData(FlowingDataException::getInstance()),
        mUltra(UltraException::getInstance()),
        mRgb(RgbShotManager::getInstance()),
        mWorkerQueue(new WorkerQueue) {
    // Device: captures of the screen arrive on binder threads. A process that does not run them yet
    // starts them here: ProcessState::self()->startThreadPool().
    std::thread([this] { dispatchEvents(); }).detach();
    std::thread([this] { sampleScreen(); }).detach();
}

void SensorService::bootCompleted() {
    mFlowingData->notifyBootCompleted();
    mSdc->sendBootShutdownRebootState(1);
}

void SensorService::goDown() {
    mSdc->sendBootShutdownRebootState(0);
}

void SensorService::charge(int state) {
    mSdc->sendChargeState(state);
}

void SensorService::countDays(int days) {
    mSdc->sendUsedTime(days);
}

void SensorService::display(int state) {
    notify({kDisplayNotification, 0, state});
    {
        const std::lock_guard lock(mMutex);
        mDisplayOn = state == kDisplayOn;
    }
    wakeSampler();
}

void SensorService::notify(std::vector<int> notification) {
    android::Vector<int> values;
    values.appendArray(notification.data(), notification.size());
    mSdc->setNotification(values);
}

// Device: a timer makes the calls of both halves, the second ones five seconds after the first.
void SensorService::passHour(int hour, std::chrono::milliseconds length) {
    mSdc->notifySdcClock(hour);
    mSdc->putRgbShotTally(hour);
    mSdc->putPhoneOpenUltraTally(hour);
    // Reports are posted and resets act at once: the worker must come first, in a short hour too.
    const std::chrono::milliseconds resetDelay =
            std::min<std::chrono::milliseconds>(5s, length / 10);
    std::this_thread::sleep_for(resetDelay);
    mWorkerQueue->wait();
    mSdc->notifySdcReset(hour);
    mSdc->notifyRgbShotReset(hour);
    mSdc->notifyUltraReset(hour);
    std::this_thread::sleep_for(length - resetDelay);
}

void SensorService::post(const sensors_event_t& event) {
    const std::lock_guard lock(mMutex);
    mEvents.push_back(event);
    mChanged.notify_all();
}

void SensorService::dataFlowBroke(int type) {
    mFlowingData->notifyUpdateDetectCount(type);
}

void SensorService::ultraActs(int code, const std::string& pkg, int phoneState) {
    mUltra->doAction(code, {pkg, phoneState});
}

void SensorService::happened(void (RgbShotManager::*trigger)()) {
    (mRgb->*trigger)();
    wakeSampler();
}

void SensorService::changeTransition(int status) {
    mRgb->onTransitionStatusChange(status);
    wakeSampler();
}

// Device: the service's threadLoop() is this thread, and poll() of the sensors gives the events.
void SensorService::dispatchEvents() {
    std::unique_lock lock(mMutex);
    for (;;) {
        mChanged.wait(lock, [this] { return !mEvents.empty(); });
        const sensors_event_t event = mEvents.front();
        lock.unlock();
        if (event.type == kUltraEnergy) mUltra->setUltraEnergy(event);
        mSdc->process(event);
        lock.lock();
        mEvents.pop_front();
        mChanged.notify_all();
    }
}

void SensorService::sampleScreen() {
    std::unique_lock lock(mMutex);
    for (;;) {
        mSampling = false;
        mChanged.notify_all();
        mChanged.wait(lock, [this] { return mTriggered && mDisplayOn; });
        mTriggered = false;
        mSampling = true;
        lock.unlock();
        while (mayStillSample()) takeTurn();
        lock.lock();
    }
}

bool SensorService::mayStillSample() {
    if (mRgb->stopRgbThread()) return false;
    const std::lock_guard lock(mMutex);
    return mDisplayOn;
}

void SensorService::takeTurn() {
    if (mRgb->allowRgbShot()) {
        int rgb[3];
        int area[4] = {kSampleArea[0], kSampleArea[1], kSampleArea[2], kSampleArea[3]};
        // Device: the colour goes to the light sensor's compensation.
        if (mRgb->getScreenPixcel(rgb, area) == 1) {
            std::printf("sample %d %d %d\n", rgb[0], rgb[1], rgb[2]);
        }
        return;
    }
    {
        const std::lock_guard lock(mMutex);
        ++mIdleTurns;
        mChanged.notify_all();
    }
    std::this_thread::sleep_for(kTurn);
}

void SensorService::wakeSampler() {
    const std::lock_guard lock(mMutex);
    mTriggered = true;
    mChanged.notify_all();
}

void SensorService::settle() {
    {
        std::unique_lock lock(mMutex);
        // A turn that runs already may not have seen the last trigger: wait for a whole one.
        const int idleTurns = mIdleTurns + 2;
        mChanged.wait(lock, [this, idleTurns] {
            const bool sampled = !mSampling && !(mTriggered && mDisplayOn);
            return mEvents.empty() && (sampled || mIdleTurns >= idleTurns);
        });
    }
    mWorkerQueue->wait();
}

}  // namespace host
