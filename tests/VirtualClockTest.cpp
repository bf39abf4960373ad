#include "clock/VirtualClock.h"

#include <fstream>
#include <functional>
#include <string>

#include <gtest/gtest.h>

#include "core/SensorHandlerThread.h"

namespace android {
namespace {

/** Does `work` for each message. */
class Handler : public MessageHandler {
public:
    explicit Handler(std::function<void(int)> work) : mWork(std::move(work)) {}

    void handleMessage(const Message& message) override { mWork(message.what); }

private:
    const std::function<void(int)> mWork;
};

long countMappings() {
    std::ifstream maps("/proc/self/maps");
    return std::count(std::istreambuf_iterator<char>(maps), {}, '\n');
}

TEST(VirtualClockTest, WorkersThatPostToEachOtherSettleAtOneMomentAndRunInTheDriversTurnsOnly) {
    const sp<SensorHandlerThread> first = new SensorHandlerThread("first", 0);
    const sp<SensorHandlerThread> second = new SensorHandlerThread("second", 0);
    std::string seen;
    sp<Handler> answer;
    const sp<Handler> ask = new Handler([&](int what) {
        seen += std::to_string(virtual_clock::now() / 1'000'000) + " asks " + std::to_string(what);
        if (what > 0) second->sendMessage(answer, what);
    });
    answer = new Handler([&](int what) {
        seen += ", answers; ";
        first->sendMessage(ask, what - 1);
    });
    first->sendMessageDelayed(ask, 2, 5);
    first->sendMessageDelayed(ask, 0, 7);
    EXPECT_EQ(seen, "");
    virtual_clock::advanceTo(6'000'000);
    EXPECT_EQ(seen, "5 asks 2, answers; 5 asks 1, answers; 5 asks 0");
    EXPECT_EQ(virtual_clock::now(), 6'000'000);
}

TEST(VirtualClockTest, AWorkerThatEndsFreesItsStackAndLeavesTheOthersRunning) {
    const sp<SensorHandlerThread> other = new SensorHandlerThread("other", 0);
    virtual_clock::settle();
    const long mappings = countMappings();
    for (int i = 0; i < 100; ++i) {
        const sp<SensorHandlerThread> thread = new SensorHandlerThread("short", 0);
        virtual_clock::settle();
        thread->quit();
        virtual_clock::settle();
        ASSERT_FALSE(thread->isRunning());
    }
    EXPECT_LT(countMappings(), mappings + 50);
    int seen = 0;
    other->sendMessage(new Handler([&](int what) { seen = what; }), 3);
    virtual_clock::settle();
    EXPECT_EQ(seen, 3);
}

TEST(VirtualClockTest, WaitingForAWorkersEndIsRefusedForTheDriverWouldWaitForItself) {
    const sp<SensorHandlerThread> thread = new SensorHandlerThread("worker", 0);
    EXPECT_EQ(thread->requestExitAndWait(), WOULD_BLOCK);
}

}  // namespace
}  // namespace android
