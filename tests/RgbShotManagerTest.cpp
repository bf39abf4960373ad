#include "rgb/RgbShotManager.h"

#include <cmath>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "core/Log.h"
#include "rgb/LightSensorState.h"
#include "tests/DeviceTest.h"
#include "tests/Locks.h"

namespace android {
namespace {

class RgbShotManagerTest : public DeviceTest {
protected:
    /** `policy` allows samples. */
    RgbShotManagerTest() { policy = 1; }

    /** A manager without a past; it lives as long as the process, as the library's own does. */
    static RgbShotManager& newManager() {
        static auto* const managers = new std::vector<RgbShotManager*>;
        managers->push_back(new RgbShotManager);
        return *managers->back();
    }

    /** A step of a course, see below. */
    void take(RgbShotManager* manager, const std::string& step) {
        const std::string rest = step.substr(1);
        const int number = rest.empty() ? 0 : std::stoi(rest);
        switch (step[0]) {
            case '+':
                return manager->setRgbShotDelay(number, std::stoi(rest.substr(rest.find('@') + 1)));
            case '=':
                return manager->setRgbShot(number);
            case 'c':
                return manager->clearQueue();
            case '?':
                EXPECT_EQ(allowedNow(manager), number);
                return;
            case 'y':
            case 'n':
                EXPECT_EQ(manager->allowRgbShot(), step == "y");
                return;
            default:
                EXPECT_EQ(manager->stopRgbThread(), step == ".");
        }
    }

    /** How many samples are allowed at `ms`, at most 100. */
    int allowedAt(double ms, RgbShotManager* manager) {
        advanceTo(ms);
        return allowedNow(manager);
    }

    static int allowedNow(RgbShotManager* manager) {
        int count = 0;
        while (count < 100 && manager->allowRgbShot()) ++count;
        return count;
    }
};

struct Trigger {
    const char* name;
    void (*pull)(RgbShotManager*);
    int now;
    int delayMs;
    int later;
};

TEST_F(RgbShotManagerTest, ATriggerAllowsItsSamplesAtOnceAndAfterItsDelay) {
    const Trigger kTriggers[] = {
            {"touch", [](RgbShotManager* m) { m->onTouchChange(); }, 1, 0, 0},
            {"lux", [](RgbShotManager* m) { m->luxChange(); }, 2, 0, 0},
            {"color", [](RgbShotManager* m) { m->colorChange(); }, 3, 0, 0},
            {"user", [](RgbShotManager* m) { m->onUserPresent(); }, 3, 0, 0},
            {"auto mode", [](RgbShotManager* m) { m->autoModeChange(); }, 3, 8000, 3},
            {"eye", [](RgbShotManager* m) { m->eyeChange(); }, 0, 2000, 1},
            {"policy", [](RgbShotManager* m) { m->policyChange(); }, 0, 200, 5},
            {"transition", [](RgbShotManager* m) { m->onTransitionStatusChange(-3); }, 2, 8000, 2},
            {"shots", [](RgbShotManager* m) { m->setRgbShot(7); }, 7, 0, 0},
            {"delayed shots", [](RgbShotManager* m) { m->setRgbShotDelay(4, 33); }, 0, 33, 4},
            {"past shots", [](RgbShotManager* m) { m->setRgbShotDelay(4, -1); }, 4, 0, 0},
            {"no shots", [](RgbShotManager* m) { m->setRgbShot(-2); }, 0, 0, 0},
    };
    double ms = 0;
    for (const Trigger& trigger : kTriggers) {
        SCOPED_TRACE(trigger.name);
        RgbShotManager& manager = newManager();
        trigger.pull(&manager);
        EXPECT_EQ(allowedAt(ms, &manager), trigger.now);
        EXPECT_EQ(manager.stopRgbThread(), trigger.later == 0);
        ms += trigger.delayMs;
        EXPECT_EQ(allowedAt(ms, &manager), 0) << "due now is not over";
        EXPECT_EQ(allowedAt(ms += 1, &manager), trigger.later);
        EXPECT_TRUE(manager.stopRgbThread());
    }
}

TEST_F(RgbShotManagerTest, WhileBlockedTheBudgetAndTheQueueStandStill) {
    RgbShotManager& manager = newManager();
    manager.colorChange();
    manager.policyChange();
    policy = 0;
    EXPECT_EQ(allowedAt(1000, &manager), 0);
    policy = 1;
    manager.onTransitionStatusChange(0);
    EXPECT_TRUE(manager.skipLux());
    EXPECT_EQ(allowedAt(2000, &manager), 0);
    EXPECT_FALSE(manager.isEmpty());
    manager.onTransitionStatusChange(1);
    EXPECT_FALSE(manager.skipLux());
    EXPECT_EQ(allowedAt(2000, &manager), 5) << "3 were left; the queued 5 are due";
}

TEST_F(RgbShotManagerTest, ClearingTheQueueLeavesThePendingEntry) {
    RgbShotManager& manager = newManager();
    manager.eyeChange();
    EXPECT_EQ(allowedAt(0, &manager), 0);
    manager.policyChange();
    taken();
    manager.clearQueue();
    EXPECT_EQ(taken(), Lines{});
    mLogSwitch = 1;
    manager.clearQueue();
    EXPECT_EQ(taken(), (Lines{"0 log 4 UL: clearQueue"}));
    EXPECT_TRUE(manager.isEmpty());
    EXPECT_FALSE(manager.stopRgbThread());
    EXPECT_EQ(allowedAt(2001, &manager), 1);
}

TEST_F(RgbShotManagerTest, NothingIsGrantedIfAnotherThreadIsFasterThanTheTake) {
    const struct {
        const char* name;
        void (*otherThread)(RgbShotManager*);
        int later;
    } kCases[] = {
            {"clears the queue", [](RgbShotManager* m) { m->clearQueue(); }, 0},
            {"takes the entry", [](RgbShotManager* m) { m->allowRgbShot(); }, 3},
    };
    double ms = 0;
    for (const auto& other : kCases) {
        SCOPED_TRACE(other.name);
        RgbShotManager& manager = newManager();
        manager.setRgbShotDelay(5, -1);
        EXPECT_EQ(allowedAt(ms, &manager), 5);
        manager.setRgbShotDelay(3, 10);
        const std::function<void()> act = [&] { other.otherThread(&manager); };
        beforeLock(2, &act);
        EXPECT_FALSE(manager.allowRgbShot());
        EXPECT_EQ(locksUntilAct(), 0);
        EXPECT_EQ(manager.stopRgbThread(), other.later == 0);
        EXPECT_EQ(allowedAt(ms += 11, &manager), other.later);
        EXPECT_TRUE(manager.stopRgbThread());
    }
}

TEST_F(RgbShotManagerTest, TestModeIsReadFromThePropertyAndAllowsEverything) {
    const struct {
        const char* text;
        const char* mode;
    } kTexts[] = {{"", "0"},    {"abc", "0"}, {" 12x", "12"},
                  {"-1", "-1"}, {"0", "0"},   {"4294967296", "2147483647"}};
    policy = 0;
    for (const auto& [text, mode] : kTexts) {
        setProperty("persist.sys.skip_restrict", text);
        taken();
        RgbShotManager& manager = newManager();
        EXPECT_EQ(taken(), (Lines{std::string("0 log 4 UL: isTestMode = ") + mode}));
        manager.onTransitionStatusChange(0);
        const bool isOn = std::string(mode) != "0";
        EXPECT_EQ(allowedAt(0, &manager), isOn ? 100 : 0) << text;
        EXPECT_TRUE(manager.stopRgbThread());

        setProperty("persist.sys.skip_restrict", "no number");
        manager.isTestMode();
        EXPECT_EQ(manager.allowRgbShot(), isOn) << text;
    }
}

TEST_F(RgbShotManagerTest, TheClockWrapsAt32Bits) {
    const struct {
        double monotonic;
        long long shown;
    } kTimes[] = {{0.999999, 0},
                  {1999.999, 1999},
                  {2147483647, 2147483647},
                  {2147483648, -2147483648LL},
                  {4294967296, 0},
                  {9000000000000, 2043514880}};
    RgbShotManager& manager = newManager();
    for (const auto& [monotonic, shown] : kTimes) {
        advanceTo(monotonic);
        EXPECT_EQ(manager.getCurrentMs(), shown);
    }
}

struct Course {
    const char* name;
    double start;  // in ms of the manager's clock, as if it counted from 0 to 2^32
    const char* steps;
};

/** Where the clock turns negative. It comes back to 0 at twice this. */
constexpr double kTurn = 2147483648;

TEST_F(RgbShotManagerTest, AQueuedEntryIsTakenInOrderAndBecomesDueAlone) {
    // Pairs of a time after the start and a step: "+3@50" queues 3 samples for 50 ms later, "=2"
    // raises the budget to 2, "c" clears the queue, "?4" finds 4 samples allowed, "y" and "n" ask
    // for one, "." and "!" find that the sampling may end or not.
    const Course kCourses[] = {
            {"an entry is due after its time", 0, "0 . 0 +3@50 0 ! 50 n 51 ?3 52 ."},
            {"an earlier one waits for the pending one", 0,
             "0 +5@100 0 n 0 +3@50 60 n 99 n 101 y 101 ?4 102 ."},
            {"an earlier one is taken first if none is pending", 0,
             "0 +5@100 0 +3@50 60 ?3 60 ! 101 ?5 102 ."},
            {"of equal times the smaller budget comes first", 0, "0 +5@10 0 +1@10 11 ?6"},
            {"equal entries are both kept", 0, "0 +2@10 0 +2@10 11 y 11 y 11 y 11 n"},
            {"a raise does not add", 0, "0 =5 0 +3@0 1 ?5 1 =1 1 =3 1 ?3"},
            {"a budget below what is there changes nothing", 0, "0 =2 0 =-9 0 =0 0 ?2"},
            {"no samples and fewer grant nothing", 0, "0 +0@1 0 +-3@1 5 n 5 n 5 ."},
            {"none is pending as well", 0, "0 +0@1 0 n 0 ! 5 n 5 ."},
            {"a clear leaves the pending one and the budget", 0,
             "0 =1 0 +2@9 0 +4@20 0 y 0 c 5 n 10 ?2 30 n 30 ."},
            {"a clear without a pending one leaves nothing", 0, "0 +2@9 0 c 0 . 30 n"},
            {"a delay may be negative", 0, "0 +2@-1 0 ?2"},
            {"nothing happens as the clock reaches its end", kTurn - 100, "0 +3@50 51 ?3 99 ."},
            {"a time beyond the end of the clock never comes", kTurn - 100,
             "0 +3@200 0 n 300 n 4000000000 n 9000000000 n 9000000000 !"},
            {"what is due before the end comes a whole turn later", kTurn - 100,
             "0 +3@50 0 n 101 n 1000 n 4294967346 n 4294967347 ?3"},
            {"times of the negative clock are as good", kTurn, "0 +3@50 0 n 50 n 51 ?3"},
            {"zero is a time like others", 2 * kTurn - 25, "0 +3@50 50 n 51 ?3 52 ."},
    };
    double ms = 0;
    for (const Course& course : kCourses) {
        const double turns = std::ceil((ms - course.start) / (2 * kTurn));
        const double start = turns * 2 * kTurn + course.start;
        RgbShotManager& manager = newManager();
        std::istringstream steps(course.steps);
        double after = 0;
        std::string step;
        while (steps >> after >> step) {
            SCOPED_TRACE(std::string(course.name) + ": " + std::to_string(after) + ' ' + step);
            advanceTo(ms = start + after);
            take(&manager, step);
        }
    }
}

}  // namespace
}  // namespace android
