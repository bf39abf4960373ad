#include "platform/PropertyService.h"

#include <atomic>
#include <csignal>
#include <functional>
#include <set>
#include <thread>

#include <cutils/properties.h>
#include <sys/wait.h>
#include <unistd.h>

#include "tests/DeviceTest.h"
#include "tests/TestFolder.h"

namespace {

class PropertyServiceTest : public DeviceTest {
protected:
    const TestFolder mFolder;
};

TEST_F(PropertyServiceTest, RefusesWhatTheDeviceRefuses) {
    EXPECT_EQ(property_set("", "1"), -1);
    EXPECT_EQ(property_set(nullptr, "1"), -1);
    EXPECT_EQ(property_set("persist.zuno.ultra.phone.enable.count", "1"), 0);
    EXPECT_EQ(property_set(std::string(65535, 'n').c_str(), "1"), 0);
    EXPECT_EQ(property_set(std::string(65536, 'n').c_str(), "1"), -1);
    EXPECT_EQ(property_set("a", std::string(91, 'v').c_str()), 0);
    EXPECT_EQ(property_set("a", std::string(92, 'w').c_str()), -1);
    EXPECT_EQ(property("a"), std::string(91, 'v'));
    EXPECT_EQ(property_set("ro.a", "first"), 0);
    EXPECT_EQ(property_set("ro.a", "second"), -1);
    EXPECT_EQ(property_set("rock", "1") + property_set("rock", "2"), 0);
    EXPECT_EQ(property("ro.a"), "first");
    EXPECT_EQ(taken().size(), 6u) << "only what was set is observed";
    platform::setDeviceProperty("ro.a", "new image");
    EXPECT_EQ(property("ro.a"), "new image");
    platform::setDeviceProperty("a", std::string(92, 'w'));
    EXPECT_EQ(property("a"), std::string(91, 'v'));
    EXPECT_EQ(taken(), Lines{}) << "the rest of the device is not observed";
    EXPECT_EQ(property_set("a", nullptr), 0);
    EXPECT_EQ(property("a"), "");
}

TEST_F(PropertyServiceTest, AnEmptyValueReadsAsUnset) {
    char value[PROP_VALUE_MAX] = "old";
    EXPECT_EQ(property_get("a", value, "default"), 7);
    EXPECT_STREQ(value, "default");
    setProperty("a", "");
    EXPECT_EQ(property_get("a", value, "default"), 7);
    EXPECT_EQ(property_get("a", value, nullptr), 0);
    EXPECT_STREQ(value, "");
    EXPECT_EQ(property_get("a", value, std::string(200, 'd').c_str()), 91);
    setProperty("a", "x");
    EXPECT_EQ(property_get("a", value, "default"), 1);
}

TEST_F(PropertyServiceTest, AFileKeepsWhatSurvivesABoot) {
    ASSERT_EQ(platform::openProperties(mFolder / "store"), std::nullopt);
    property_set("persist.a", "1");
    property_set("ro.b", "2");
    property_set("sys.c", "3");
    property_set("persistent", "4");
    ASSERT_EQ(platform::openProperties(mFolder / "other"), std::nullopt);
    EXPECT_EQ(property("persist.a"), "");
    ASSERT_EQ(platform::openProperties(mFolder / "store"), std::nullopt);
    EXPECT_EQ(property("sys.c"), "3");
    platform::dropVolatileProperties();
    EXPECT_EQ(property("persist.a") + property("ro.b"), "12");
    EXPECT_EQ(property("sys.c") + property("persistent"), "");
}

/** Runs `work(0)` to `work(3)` at once in processes of their own; their exit statuses. */
std::multiset<int> inProcesses(const std::function<int(int)>& work) {
    std::multiset<int> statuses;
    int gate[2];
    EXPECT_EQ(pipe(gate), 0);
    for (int i = 0; i < 4; ++i) {
        if (fork() != 0) continue;
        close(gate[1]);
        char end = 0;
        _exit(read(gate[0], &end, 1) == 0 ? work(i) : 10);  // returns when the gate is closed
    }
    close(gate[1]);
    close(gate[0]);
    for (int status = 0; wait(&status) > 0;) {
        statuses.insert(WIFEXITED(status) ? WEXITSTATUS(status) : -1);
    }
    return statuses;
}

TEST_F(PropertyServiceTest, ProcessesShareAFileFromTheMomentOneOfThemMakesIt) {
    for (int round = 0; round < 5; ++round) {
        const std::string store = mFolder / std::to_string(round);
        const auto statuses = inProcesses([&](int process) {
            if (platform::openProperties(store)) return 9;
            const std::string name = "persist." + std::to_string(process);
            for (int i = 0; i < 50; ++i) {
                if (property_set(name.c_str(), std::to_string(i).c_str()) != 0) return 8;
                if (property(name) != std::to_string(i)) return 7;
            }
            const bool isFirst = property_set("ro.first", name.c_str()) == 0;
            return platform::closeProperties() ? 6 : static_cast<int>(isFirst);
        });
        EXPECT_EQ(statuses, (std::multiset<int>{0, 0, 0, 1}));
        ASSERT_EQ(platform::openProperties(store), std::nullopt);
        for (const char* name : {"persist.0", "persist.1", "persist.2", "persist.3"}) {
            EXPECT_EQ(property(name), "49");
        }
        EXPECT_NE(property("ro.first"), "");
    }
}

TEST_F(PropertyServiceTest, AKilledProcessLosesNothingThatWasSet) {
    const std::string store = mFolder / "store";
    inProcesses([&](int process) {
        if (platform::openProperties(store)) return 9;
        property_set(("persist." + std::to_string(process)).c_str(), "1");
        return raise(SIGKILL);
    });
    ASSERT_EQ(platform::openProperties(store), std::nullopt);
    for (const char* name : {"persist.0", "persist.1", "persist.2", "persist.3"}) {
        EXPECT_EQ(property(name), "1");
    }
}

TEST_F(PropertyServiceTest, ThreadsSeeWholeValues) {
    std::vector<std::thread> threads;
    std::atomic<int> torn{0};
    platform::observePropertySet(nullptr);
    for (char letter = 'a'; letter < 'e'; ++letter) {
        threads.emplace_back([&torn, letter] {
            for (int i = 0; i < 200; ++i) {
                property_set("a", std::string(letter % 2 == 0 ? 91 : 40, letter).c_str());
                const std::string value = property("a");
                torn += value.empty() ||
                        value != std::string(value[0] % 2 == 0 ? 91 : 40, value[0]);
                if (platform::propertyFileError()) ++torn;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(torn, 0);
}

TEST_F(PropertyServiceTest, PropertiesInMemoryTravelAsBytes) {
    setProperty("persist.a", "1");
    setProperty("sys.b", "2");
    const auto bytes = platform::saveProperties();
    setProperty("persist.a", "3");
    platform::setDeviceProperty("sys.b", std::nullopt);
    EXPECT_EQ(property("persist.a") + property("sys.b"), "3");
    platform::restoreProperties(bytes);
    EXPECT_EQ(property("persist.a") + property("sys.b"), "12");
    setProperty("persist.c", "4");
    EXPECT_EQ(property("persist.c"), "4");
}

}  // namespace
