#include "exception/UltraException.h"

#include <cmath>
#include <limits>
#include <tuple>
#include <utility>

#include "core/Log.h"
#include "tests/DeviceTest.h"

namespace android {
namespace {

enum : int { RX_CLOSED = 2, ENABLED, DEVICE_INVALID, ROUTE_INVALID, PHONE_STATE };

constexpr char kInCall[] = "com.android.incallui";

class UltraExceptionTest : public DeviceTest {
protected:
    /** The module with its counts loaded, at 2000 ms. */
    UltraException* loaded() {
        UltraException* module = UltraException::getInstance();
        advanceTo(2000);
        taken();
        return module;
    }

    /** Lets the action run before the next one comes. */
    void act(int code, const UltraExceptionInfo& info = {}) {
        UltraException::getInstance()->doAction(code, info);
        advanceTo(2000);
    }
};

TEST_F(UltraExceptionTest, EnergiesAreCutToWholeNumbers) {
    constexpr float kInfinity = std::numeric_limits<float>::infinity();
    UltraException* ultra = loaded();
    mLogSwitch = 1;
    const std::tuple<float, float, const char*> cases[] = {
            {301.7F, 55.9F, "55/0"},
            {302, -12.9F, "55/-12"},
            {303, 1, "55/-12"},
            {300.9F, 1, "55/-12"},
            {NAN, 1, "55/-12"},
            {302, NAN, "55/0"},
            {301, 2147483520, "2147483520/0"},
            {301, 2147483648, "2147483647/0"},
            {302, -kInfinity, "2147483647/-2147483648"},
    };
    std::vector<Lines> logged;
    for (const auto& [marker, energy, energies] : cases) {
        sensors_event_t event{};
        event.data[3] = marker;
        event.data[4] = energy;
        ultra->setUltraEnergy(event);
        logged.push_back(taken());
        ultra->trackEvent("N273|10011", -5, -6);
        EXPECT_EQ(taken().back(),
                  std::string("2000 N273|10011 TempInvalidRate:-6/0&pkg:unknown&ultraEnergy:") +
                          energies + "&ultraExpired:-5");
    }
    EXPECT_EQ(logged[0], (Lines{"2000 log 3 mBackgroundEnergy: 55"}));
    EXPECT_EQ(logged[1], (Lines{"2000 log 3 mFluctuantEnergy: -12"}));
    EXPECT_EQ(logged[2], Lines{});
    mLogSwitch = 0;
    for (const float marker : {301.0F, 302.0F}) {
        sensors_event_t event{};
        event.data[3] = marker;
        event.data[4] = 7;
        ultra->setUltraEnergy(event);
    }
    EXPECT_EQ(taken(), Lines{});
    ultra->resetUltraStatus();
    ultra->trackEvent("", 0, 0);
    EXPECT_EQ(taken(),
              (Lines{"2000  TempInvalidRate:0/0&pkg:unknown&ultraEnergy:0/0&ultraExpired:0"}));
}

TEST_F(UltraExceptionTest, EachCountIsLoadedFromItsPropertyAfterTwoSeconds) {
    const char* const kNames[] = {"ultra.enable",   "ultra.invalid", "ultra.phone.enable",
                                  "device.invalid", "route.invalid", "rx.close"};
    int value = 10;
    for (const char* name : kNames) {
        setProperty(std::string("persist.zuno.") + name + ".count", std::to_string(++value));
    }
    UltraException* ultra = UltraException::getInstance();
    advanceTo(1999.999);
    EXPECT_EQ(taken(), Lines{});
    advanceTo(2000);
    EXPECT_EQ(taken(), (Lines{"2000 log 3 PF, enable:11 device:14 route:15 close:16."}));
    act(RX_CLOSED);
    EXPECT_EQ(taken(), (Lines{"2000 N273|10011 TempInvalidRate:17/11&pkg:unknown&ultraEnergy:0/0"
                              "&ultraExpired:102",
                              "2000 persist.zuno.rx.close.count=17"}));
    ultra->putPhoneOpenUltraTally();
    ultra->doAction(PHONE_STATE, {"", 1});  // overtaken by nothing
    advanceTo(2000);
    EXPECT_EQ(taken(), (Lines{"2000 N273|10011 TempInvalidRate:12/13&pkg:unknown&ultraEnergy:0/0"
                              "&ultraExpired:103",
                              "2000 persist.zuno.ultra.phone.enable.count=0",
                              "2000 persist.zuno.ultra.invalid.count=0"}));
    ultra->putPhoneOpenUltraTally();
    advanceTo(3000);
    EXPECT_EQ(taken(), Lines{}) << "no call, no report and no reset";
}

TEST_F(UltraExceptionTest, TheDaysReportLeavesItsResetToTheWorkerBehindWhatWaits) {
    UltraException* ultra = loaded();
    setProperty("persist.zuno.ultra.phone.enable.count", "-3");
    ultra->initUltraSoundCount();
    act(ENABLED, {kInCall, 0});
    taken();
    ultra->doAction(ROUTE_INVALID, {});
    ultra->putPhoneOpenUltraTally();
    ultra->putPhoneOpenUltraTally();
    advanceTo(2000);
    const std::string end = std::string("&pkg:") + kInCall + "&ultraEnergy:0/0&ultraExpired:";
    const std::string daily = "2000 N273|10011 TempInvalidRate:0/-3" + end + "103";
    const std::string calls = "2000 persist.zuno.ultra.phone.enable.count=0";
    const std::string failed = "2000 persist.zuno.ultra.invalid.count=";
    EXPECT_EQ(taken(), (Lines{daily, daily, failed + "1",
                              "2000 N273|10011 TempInvalidRate:1/1" + end + "100",
                              "2000 persist.zuno.route.invalid.count=1", calls, failed + "0", calls,
                              failed + "0"}));
}

TEST_F(UltraExceptionTest, ACountOfFailuresStopsOneBeforeTheLargestNumber) {
    constexpr char kRoute[] = "persist.zuno.route.invalid.count";
    const struct {
        const char* stored;
        const char* once;
        const char* twice;
    } kCases[] = {{"2147483644", "2147483645", "2147483646"},
                  {"2147483645", "2147483646", "2147483646"},
                  {"2147483647", "2147483647", "2147483647"},
                  {"-2147483648", "-2147483647", "-2147483646"}};
    UltraException* ultra = loaded();
    for (const auto& [stored, once, twice] : kCases) {
        for (const char* name : {"ultra.enable", "route.invalid", "ultra.invalid"}) {
            setProperty(std::string("persist.zuno.") + name + ".count", stored);
        }
        ultra->initUltraSoundCount();
        for (const auto& [before, after] : {std::pair(stored, once), std::pair(once, twice)}) {
            taken();
            act(PHONE_STATE, {"", 0});  // another call
            act(ENABLED, {kInCall, 0});
            act(ROUTE_INVALID);
            Lines expected{std::string("2000 persist.zuno.ultra.enable.count=") + after};
            if (before != std::string(after)) {
                expected.push_back(std::string("2000 persist.zuno.ultra.invalid.count=") + after);
                expected.push_back(std::string("2000 N273|10011 TempInvalidRate:") + after + '/' +
                                   after + "&pkg:" + kInCall + "&ultraEnergy:0/0&ultraExpired:100");
                expected.push_back(std::string("2000 ") + kRoute + '=' + after);
            }
            EXPECT_EQ(taken(), expected);
        }
    }
}

TEST_F(UltraExceptionTest, NamesAreKeptUpTo1023Bytes) {
    UltraException* ultra = loaded();
    for (const size_t length : {1023, 1024, 100'000, 255, 256, 0, 1}) {
        const std::string name = std::string(length, 'a') + (length < 1023 ? kInCall : "");
        act(ENABLED, {name, 0});
        taken();
        ultra->trackEvent("", 0, 0);
        EXPECT_NE(taken().back().find("&pkg:" + name.substr(0, 1023) + "&"), std::string::npos)
                << length;
    }
}

TEST_F(UltraExceptionTest, AnActionThatStillWaitsMovesBehindTheOthers) {
    UltraException* ultra = loaded();
    ultra->doAction(ENABLED, {"com.example.first", 0});
    ultra->doAction(DEVICE_INVALID, {"ignored", 1});
    ultra->doAction(std::numeric_limits<int>::min(), {});
    ultra->doAction(ENABLED, {"com.example.second", 0});
    advanceTo(2000);
    EXPECT_EQ(taken(), (Lines{"2000 N273|10011 TempInvalidRate:1/0&pkg:com.example.second"
                              "&ultraEnergy:0/0&ultraExpired:101",
                              "2000 persist.zuno.device.invalid.count=1",
                              "2000 persist.zuno.ultra.enable.count=1"}));
}

TEST_F(UltraExceptionTest, ACallUsesTheSensorIfAnAppIsKnownOrEnablesItMeanwhile) {
    const std::string kEnables = "2000 persist.zuno.ultra.enable.count=";
    const std::string kCalls = "2000 persist.zuno.ultra.phone.enable.count=";
    UltraException* ultra = loaded();
    const auto begin = [&] { act(PHONE_STATE, {"", -1}); };
    const auto end = [&] { act(PHONE_STATE, {"", 0}); };
    begin();
    end();
    EXPECT_EQ(taken(), Lines{});

    begin();
    act(ENABLED, {"", 0});
    end();
    end();
    EXPECT_EQ(taken(), (Lines{kEnables + "1", kCalls + "1"}));

    begin();
    end();
    EXPECT_EQ(taken(), (Lines{kCalls + "2"}));

    ultra->resetUltraStatus();
    begin();
    ultra->doAction(ENABLED, {"", 0});
    end();  // the enable runs only now
    EXPECT_EQ(taken(), (Lines{kEnables + "2"}));

    act(ENABLED, {"unknown", 0});
    begin();
    end();
    EXPECT_EQ(taken(), (Lines{kEnables + "3"}));

    act(ENABLED, {"unknown.app", 0});
    begin();
    end();
    EXPECT_EQ(taken(), (Lines{kEnables + "4", kCalls + "3"}));
}

TEST_F(UltraExceptionTest, FullCountsStayButTheCallsWrap) {
    for (const char* name : {"ultra.enable", "device.invalid", "route.invalid", "rx.close"}) {
        setProperty(std::string("persist.zuno.") + name + ".count", "2147483646");
    }
    setProperty("persist.zuno.ultra.invalid.count", "2147483645");
    setProperty("persist.zuno.ultra.phone.enable.count", "2147483647");
    UltraException* ultra = loaded();
    for (int i = 0; i < 2; ++i) {
        act(PHONE_STATE, {"", 1});
        act(ENABLED, {kInCall, 0});
        for (const int failure : {RX_CLOSED, DEVICE_INVALID, ROUTE_INVALID}) act(failure);
        act(PHONE_STATE, {"", 0});
    }
    EXPECT_EQ(taken(), (Lines{"2000 persist.zuno.ultra.enable.count=2147483646",
                              "2000 persist.zuno.ultra.invalid.count=2147483646",
                              "2000 persist.zuno.ultra.phone.enable.count=-2147483648",
                              "2000 persist.zuno.ultra.enable.count=2147483646",
                              "2000 persist.zuno.ultra.phone.enable.count=-2147483647"}));

    // The reset lets failed calls be counted from 0 again.
    ultra->notifyUltraReset();
    act(ENABLED, {kInCall, 0});
    act(ROUTE_INVALID);
    EXPECT_EQ(property("persist.zuno.ultra.invalid.count"), "1");
}

}  // namespace
}  // namespace android
