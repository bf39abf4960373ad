#include "rgb/RgbShotManager.h"

#include <algorithm>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include <dlfcn.h>
#include <pthread.h>

#include "core/Log.h"
#include "rgb/LightSensorState.h"
#include "tests/DeviceTest.h"

namespace {

/** What another thread does just before this one takes its `locksUntilThen`-th lock from now. */
thread_local const std::function<void()>* otherThread = nullptr;
thread_local int locksUntilThen = 0;

}  // namespace

/** The sanitizers' own `pthread_mutex_lock`, in their builds. */
extern "C" int sanitizersLock(pthread_mutex_t* mutex) asm("__interceptor_pthread_mutex_lock")
        __attribute__((weak));

extern "C" int pthread_mutex_lock(pthread_mutex_t* mutex) noexcept {
    static const auto libcLock =
            reinterpret_cast<int (*)(pthread_mutex_t*)>(dlsym(RTLD_NEXT, "pthread_mutex_lock"));
    if (locksUntilThen > 0 && --locksUntilThen == 0) (*otherThread)();
    return sanitizersLock != nullptr ? sanitizersLock(mutex) : libcLock(mutex);
}

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

    /** How many samples are allowed at `ms`, at most 100. */
    int allowedAt(double ms, RgbShotManager* manager) {
        advanceTo(ms);
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
        otherThread = &act;
        locksUntilThen = 2;
        EXPECT_FALSE(manager.allowRgbShot());
        EXPECT_EQ(locksUntilThen, 0);
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

/** What a manager should do, in the plainest way: a list to search. */
struct Model {
    std::vector<std::pair<long long, int>> queue;
    std::vector<std::pair<long long, int>> pending;  // at most one
    int budget = 0;

    void schedule(long long ms, int delayMs, int shots) {
        queue.emplace_back(static_cast<long long>(static_cast<int32_t>(ms)) + delayMs, shots);
    }

    void raise(int shots) { budget = std::max(budget, shots); }

    bool allow(long long ms) {
        if (pending.empty() && !queue.empty()) {
            const auto first = std::min_element(queue.begin(), queue.end());
            pending.push_back(*first);
            queue.erase(first);
        }
        if (!pending.empty() && pending[0].first < static_cast<int32_t>(ms)) {
            raise(pending[0].second);
            pending.clear();
        }
        return budget > 0 && budget-- > 0;
    }
};

TEST_F(RgbShotManagerTest, AgreesWithAPlainModelAlsoAcrossTheClocksWrap) {
    std::mt19937 random(1);
    const auto below = [&](unsigned limit) { return static_cast<int>(random() % limit); };
    for (const long long wrap : {1LL << 31, 1LL << 32}) {
        long long ms = wrap - 15'000;
        RgbShotManager& manager = newManager();
        Model model;
        for (int step = 0; step < 10'000; ++step) {
            if (below(4) == 0) ms += below(step % 2 == 0 ? 40 : 4);
            advanceTo(static_cast<double>(ms));
            const int shots = below(5) - 1;
            const int delayMs = below(400) - 20;
            switch (below(8)) {
                case 0:
                    manager.setRgbShotDelay(shots, delayMs);
                    model.schedule(ms, delayMs, shots);
                    break;
                case 1:
                    manager.policyChange();
                    model.schedule(ms, 200, 5);
                    break;
                case 2:
                    manager.setRgbShot(shots);
                    model.raise(shots);
                    break;
                case 3:
                    if (below(20) != 0) break;
                    manager.clearQueue();
                    model.queue.clear();
                    break;
                default:
                    ASSERT_EQ(manager.allowRgbShot(), model.allow(ms)) << step << " at " << ms;
            }
            ASSERT_EQ(manager.isEmpty(), model.queue.empty()) << step << " at " << ms;
            ASSERT_EQ(manager.stopRgbThread(),
                      model.budget <= 0 && model.queue.empty() && model.pending.empty());
        }
    }
}

}  // namespace
}  // namespace android
