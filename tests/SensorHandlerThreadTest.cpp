#include "core/SensorHandlerThread.h"

#include <limits>
#include <utility>

#include <utils/AndroidThreads.h>

#include "clock/VirtualClock.h"
#include "core/SDCImpl.h"
#include "tests/DeviceTest.h"
#include "usage/MagneticUseIf.h"

namespace android {
namespace {

/** Notes each message with its time: "500 a3" for code 3 of the handler "a", 500 ms after 0. */
class Recorder : public MessageHandler {
public:
    Recorder(std::string name, Lines* lines) : mName(std::move(name)), mLines(lines) {}

    void handleMessage(const Message& message) override {
        mLines->push_back(std::to_string(virtual_clock::now() / 1'000'000) + ' ' + mName +
                          std::to_string(message.what));
    }

private:
    const std::string mName;
    Lines* const mLines;
};

class SensorHandlerThreadTest : public DeviceTest {
protected:
    SensorHandlerThread* const mThread = SensorHandlerThread::getInstance();
    Lines mLines;
    const sp<Recorder> mA = new Recorder("a", &mLines);
    const sp<Recorder> mB = new Recorder("b", &mLines);
};

TEST_F(SensorHandlerThreadTest, RunsMessagesAtTheirTimesAndEqualTimesInOrderOfPosting) {
    mThread->sendMessageDelayed(mA, 1, 500);
    mThread->sendMessageDelayed(mB, 2, 200);
    mThread->sendMessageDelayed(mA, 3, 200);
    mThread->sendMessage(mB, 4);
    mThread->sendMessageDelayed(mA, 5, 0);
    advanceTo(200);
    EXPECT_EQ(mLines, (Lines{"0 b4", "0 a5", "200 b2", "200 a3"}));
    advanceTo(499);
    EXPECT_EQ(mLines.size(), 4u);
    advanceTo(1000);
    EXPECT_EQ(mLines.back(), "500 a1");
}

TEST_F(SensorHandlerThreadTest, ANegativeDelayIsDueAtOnceAndTheLongestDelayDoesNotOverflow) {
    mThread->sendMessageDelayed(mA, 1, std::numeric_limits<int>::max());
    mThread->sendMessageDelayed(mA, 2, -5);
    advanceTo(2147483646);
    EXPECT_EQ(mLines, (Lines{"0 a2"}));
    advanceTo(2147483647);
    EXPECT_EQ(mLines.back(), "2147483647 a1");
}

TEST_F(SensorHandlerThreadTest, RunsMessagesOverTheEndOfSecondsIn32Bits) {
    advanceTo(2147483647000);
    mThread->sendMessageDelayed(mA, 1, 2000);
    advanceTo(2147483650000);
    EXPECT_EQ(mLines, (Lines{"2147483649000 a1"}));
}

TEST_F(SensorHandlerThreadTest, RemovesAllMessagesOfACodeOrOfAHandlerAndNoOthers) {
    for (int delayMs : {0, 10, 20}) {
        mThread->sendMessageDelayed(mA, 1, delayMs);
        mThread->sendMessageDelayed(mA, 2, delayMs);
        mThread->sendMessageDelayed(mB, 1, delayMs);
    }
    mThread->removeMessage(mA, 1);
    advanceTo(10);
    EXPECT_EQ(mLines, (Lines{"0 a2", "0 b1", "10 a2", "10 b1"}));
    mThread->removeAllMessages(mA);
    advanceTo(20);
    EXPECT_EQ(mLines.size(), 5u);
    EXPECT_EQ(mLines.back(), "20 b1");
}

TEST_F(SensorHandlerThreadTest, FractionsWaitForWholeMillisecondsFromTheStartOfTheWait) {
    mThread->sendMessageDelayed(mA, 1, 100);
    advanceTo(0.25);
    mThread->sendMessageDelayed(mB, 9, 5000);  // wakes the loop, which waits anew: 100 ms
    advanceTo(100);
    EXPECT_EQ(mLines, (Lines{}));
    advanceTo(100.25);
    EXPECT_EQ(mLines, (Lines{"100 a1"}));
}

TEST_F(SensorHandlerThreadTest, AfterQuittingNothingIsDelivered) {
    mThread->sendMessageDelayed(mA, 1, 100);
    advanceTo(50);
    mThread->quit();
    mThread->quit();
    mThread->sendMessage(mA, 2);
    advanceTo(1000);
    mThread->sendMessage(mA, 3);
    advanceTo(2000);
    // What was due when the loop was told to end still ran in its last turn.
    EXPECT_EQ(mLines, (Lines{"50 a2"}));
    EXPECT_FALSE(mThread->isRunning());
}

TEST_F(SensorHandlerThreadTest, EndsAtTheNextWakeOnceItsExitIsRequested) {
    advanceTo(0);
    mThread->requestExit();
    EXPECT_TRUE(mThread->isRunning());
    mThread->sendMessageDelayed(mA, 1, 100);
    advanceTo(1000);
    EXPECT_EQ(mLines, Lines{});
    EXPECT_FALSE(mThread->isRunning());
}

/** Creates no thread; 0 is the failure. */
int createNoThread(android_thread_func_t, void*, const char*, int32_t, size_t,
                   android_thread_id_t*) {
    return 0;
}

class WorkerlessTest : public DeviceTest {};

TEST_F(WorkerlessTest, TheLibraryLivesAndOnlyItsDeferredWorkIsUndone) {
    androidSetCreateThreadFunc(createNoThread);
    MagneticUseIf::getInstance()->sendBootShutdownRebootState(0);
    EXPECT_EQ(taken(), Lines{}) << "nothing to do, so no thread yet";
    SDCImpl* sdc = SDCImpl::getInstance();
    EXPECT_EQ(taken(), (Lines{"0 log 6 sensor_native_handler: the thread cannot be created"}));
    sdc->sendBootShutdownRebootState(1);
    sdc->setRgbShotCount();
    sdc->putRgbShotTally(7);
    sdc->notifySdcClock(8);
    sdc->notifySdcReset(8);
    EXPECT_EQ(taken(), (Lines{"0 N273|10009 count:1"}));
    EXPECT_FALSE(SensorHandlerThread::getInstance()->isRunning());
    SensorHandlerThread::getInstance()->quit();
}

}  // namespace
}  // namespace android
