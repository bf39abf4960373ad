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
    for (const auto& [marker, energy, energies] : cases) {
        sensors_event_t event{};
        event.data[3] = marker;
        event.data[4] = energy;
        ultra->setUltraEnergy(event);
        ultra->trackEvent("N273|10011", -5, -6);
        EXPECT_EQ(taken().back(),
                  std::string("2000 N273|10011 TempInvalidRate:-6/0&pkg:unknown&ultraEnergy:") +
                          energies + "&ultraExpired:-5");
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
