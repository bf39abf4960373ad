#pragma once

#include <chrono>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <string>
#include <vector>

#include <hardware/sensors.h>
#include <utils/StrongPointer.h>

namespace android {
class FlowingDataException;
class RgbShotManager;
class SDCImpl;
class UltraException;
}  // namespace android

namespace host {

/**
 * A sensor service reduced to what libsensor-priv sees of it: which of its threads makes which
 * call, and when. Comments that begin with "Device:" say what a device's service does instead.
 *
 * All operations may be called from any thread. The service lives as long as its process, and so do
 * its two threads: one dispatches events, one samples the screen.
 */
class SensorService {
public:
    /** Creates the library's modules, and with them its worker thread; starts both own threads. */
    SensorService();

    SensorService(const SensorService&) = delete;
    SensorService& operator=(const SensorService&) = delete;

    // The state of the device.

    void bootCompleted();
    void goDown();             // shutdown or reboot
    void charge(int state);    // 1, 2 and 3 are kinds of charging, any other is none
    void countDays(int days);  // the days that the device has been in use
    void display(int state);   // 2 is on; the screen is sampled only then
    void notify(std::vector<int> notification);  // element 0 is its kind

    /** An hour of the day begins. Returns at its end, which is `length` later. */
    void passHour(int hour, std::chrono::milliseconds length);

    // The sensors.

    /** Queues an event for the thread that dispatches. */
    void post(const sensors_event_t& event);

    void dataFlowBroke(int type);
    void ultraActs(int code, const std::string& pkg, int phoneState);

    // What lets the screen be sampled.

    void happened(void (android::RgbShotManager::*trigger)());
    void changeTransition(int status);

    /**
     * Blocks until all that was asked for so far is done: events dispatched, samples taken,
     * messages that are due run by the library's worker.
     */
    void settle();

private:
    class WorkerQueue;

    void dispatchEvents();
    void sampleScreen();
    bool mayStillSample();
    void takeTurn();
    void wakeSampler();

    // Constant after construction.
    android::SDCImpl* const mSdc;
    android::FlowingDataException* const mFlowingData;
    android::UltraException* const mUltra;
    android::RgbShotManager* const mRgb;
    const android::sp<WorkerQueue> mWorkerQueue;

    // Guarded by mMutex, which is never held while the library is called.
    std::mutex mMutex;
    std::condition_variable mChanged;
    std::deque<sensors_event_t> mEvents;  // the first one is being dispatched
    bool mDisplayOn = false;
    bool mTriggered = false;  // the sampling loop has to look again
    bool mSampling = false;   // the sampling loop runs
    int mIdleTurns = 0;       // turns of the sampling loop that were allowed no sample
};

}  // namespace host
