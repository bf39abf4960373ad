#include "exception/WechatProxException.h"

#include <cmath>
#include <limits>
#include <sstream>

#include "core/Arithmetic.h"
#include "tests/DeviceTest.h"

namespace android {
namespace {

constexpr char kRecord[] = "persist.zuno.wechat.count.info";

class WechatProxExceptionTest : public DeviceTest {
protected:
    /**
     * Plays pairs of a time in milliseconds and what the host does then: "+" and "-" begin and end
     * the chat application's hold of the proximity sensor, "D" and "d" the display controller's,
     * "r" and "R" the chat application's of the accelerometer; "v1" is a voice mode, "s1" a camera
     * state, "p5" a distance and "a2.5" a reading of x.
     */
    void play(const std::string& steps) {
        std::istringstream stream(steps);
        double ms = 0;
        std::string what;
        for (double last = -1; stream >> ms >> what; last = ms) {
            if (ms != last) advanceTo(ms);
            const float value = what.size() > 1 ? std::stof(what.substr(1)) : 0;
            if (what == "+" || what == "-") enable(what == "+", 8, "call", "x.com.tencent.mm:push");
            if (what == "D" || what == "d") {
                enable(what == "D", 8, "com.android.server.display.DisplayPowerController$3", "os");
            }
            if (what == "r" || what == "R") enable(what == "r", 1, "call", "com.tencent.mm");
            if (what[0] == 'v') mMonitor->setVoiceMode(static_cast<int>(value));
            if (what[0] == 's') mMonitor->setCameraState(static_cast<int>(value));
            if (what[0] == 'p') dispatch(8, {value});
            if (what[0] == 'a') dispatch(1, {value});
        }
    }

    void enable(bool enabled, int type, const char* pkg, const char* opPkg) {
        mMonitor->enableSuccess(enabled, type, pkg, opPkg);
    }

    void dispatch(int type, std::initializer_list<float> data) {
        sensors_event_t event{};
        event.type = type;
        std::copy(data.begin(), data.end(), event.data);
        mMonitor->process(event);
    }

    /** The spreads of x that were reported, with their times. */
    Lines reported() {
        Lines lines;
        for (const std::string& line : taken()) {
            const size_t spread = line.find("N273|10013 variance:");
            if (spread == std::string::npos) continue;
            lines.push_back(line.substr(0, spread) + line.substr(spread + 20, 8));
        }
        return lines;
    }

    /** The counters as they would be stored: total, invalid, lock, near. */
    std::string counters() {
        mMonitor->updatePropertyValue();
        return property(kRecord);
    }

    std::string spread(int from, int to) {
        float x, y, z;
        return mMonitor->getVariance(from, to, x, y, z);
    }

    WechatProxException* const mMonitor = WechatProxException::getInstance();
};

struct Call {
    const char* steps;
    Lines reports;
    const char* counters;
};

class CallTest : public WechatProxExceptionTest, public ::testing::WithParamInterface<Call> {};

TEST_P(CallTest, IsWatchedWhileTheChatApplicationHoldsTheSensor) {
    play(GetParam().steps);
    advanceTo(9000);
    EXPECT_EQ(reported(), GetParam().reports);
    EXPECT_EQ(counters(), GetParam().counters);
}

const Call kCalls[] = {
        // The fifth check reports; an end of the near after a check reports what that computed.
        {"0 v1 100 + 110 a1 140 a2 1000 p0 1050 a9 3000 -", {"1500 0.500000"}, "1_1_0_1"},
        {"0 v2 100 + 110 a1 140 a2 1000 p0 1050 p5 1051 a9 3000 -", {}, "1_0_0_1"},
        {"0 v2 100 + 110 a1 140 a2 1000 p0 1099.9 p5 3000 -", {}, "1_0_0_1"},
        {"0 v1 100 + 110 a1 140 a2 1000 p0 1100.1 p5 1110 a9 3000 -", {"1200 0.500000"}, "1_1_0_1"},
        {"0 v1 100 + 110 a1 140 a2 1000 p0 1350 p5 3000 -", {"1400 0.500000"}, "1_1_0_1"},
        {"0 v1 100 + 110 a1 140 a2 1000 p0 1450 p5 3000 -", {"1500 0.500000"}, "1_1_0_1"},
        {"0 v1 100 + 110 a1 140 a2 1000 p0 1500.1 p5 3000 -", {"1500 0.500000"}, "1_1_0_1"},
        // Nothing counts outside of voice calls, sessions, and changes of the distance.
        {"0 v0 100 + 200 D 300 d 1000 p0 3000 -", {}, "0_0_0_0"},
        {"0 v3 100 + 200 D 300 d 1000 p0 3000 -", {}, "0_0_0_0"},
        {"0 v1 0 s1 100 + 200 D 300 d 1000 p0 3000 -", {}, "0_0_0_0"},
        {"0 v2 0 s2 100 + 200 D 300 d 1000 p0 3000 -", {"1500 0.000000"}, "1_1_1_1"},
        {"0 v-1 100 + 200 D 300 d 1000 p0 3000 -", {}, "0_0_0_0"},
        {"0 v1 100 p0 150 D 200 d 200 + 300 D 310 D 320 d 400 - 500 D", {}, "0_0_2_0"},
        {"0 v1 100 + 200 p0 200 p0.9 200 p-0.9 200 pnan 200 p5.9 200 p5 200 p0 210 p5 300 -",
         {},
         "1_0_0_2"},
        // What changes between the checks, or before the first, ends them.
        {"0 v1 100 + 1000 p0 1050 -", {}, "1_0_0_1"},
        {"0 v0 100 + 1000 p0 1050 v1 3000 -", {"1500 0.000000"}, "0_1_0_0"},
        {"0 v1 100 + 1000 p0 1250 v0 1350 v1 3000 -", {}, "1_0_0_1"},
        {"0 v1 100 + 1000 p0 1250 s1 1350 s0 3000 -", {}, "1_0_0_1"},
        {"0 v1 100 + 1000 p0 1250 D 1350 d 3000 -", {}, "1_0_1_1"},
        {"0 v1 100 + 1000 p0 1150 p5 1190 p3 3000 -", {}, "1_0_0_1"},
        {"0 v1 100 + 1000 p0 1020 p3e9 1040 p0 3000 -", {"1540 0.000000"}, "1_1_0_2"},
        {"0 v1 100 + 1000 p0 1250 p3 1260 p0 3000 -", {"1760 0.000000"}, "1_1_0_2"},
        // One report a session; a second end counts its session again.
        {"0 v1 100 + 1000 p0 2000 p5 2100 p0 3000 - 3000 -", {"1500 0.000000"}, "2_2_0_2"},
        {"0 v1 100 + 1000 p0 2000 - 2000 + 2100 p0 3000 - 3000 + 3000 -",
         {"1500 0.000000", "2600 0.000000"},
         "2_2_0_2"},
        // Readings are more than 20 ms apart; far and the end of a session count them anew; a
        // fresh hold of the accelerometer clears them but not their count.
        {"0 v1 100 a7 100 + 200 a1 220 a20 220.000001 a3 1000 p0 3000 -",
         {"1500 1.000000"},
         "1_1_0_1"},
        {"0 v1 100 + 200 p-7 220 a1 240.000001 a3 1000 p0 3000 -", {"1500 1.000000"}, "1_1_0_1"},
        {"0 v1 100 + 200 a1 300 p5 400 a3 500 a5 1000 p0 3000 -", {"1500 1.000000"}, "1_1_0_1"},
        {"0 v1 2100 + 2200 a1 2300 a3 2400 - 2400 + 2500 a3 3000 p0 5000 -",
         {"3500 0.000000"},
         "1_1_0_1"},
        {"0 v1 100 + 200 a1 300 a1 400 r 500 a2 600 R 1000 p0 3000 -",
         {"1500 0.942809"},
         "1_1_0_1"},
};

INSTANTIATE_TEST_SUITE_P(Steps, CallTest, ::testing::ValuesIn(kCalls));

TEST_F(WechatProxExceptionTest, TheSpreadIsOfTheTwentyNewestReadings) {
    play("0 v1 10 +");
    for (int i = 0; i < 30; ++i) {
        play(std::to_string(100 + 30 * i) + (i < 10 ? " a99" : i % 2 == 0 ? " a1" : " a2"));
    }
    play("2000 p0 5000 -");
    EXPECT_EQ(reported(), (Lines{"2500 0.500000"}));
}

TEST_F(WechatProxExceptionTest, TheSpreadIsDefinedForEveryRangeAndReading) {
    play("0 +");
    advanceTo(100);
    dispatch(1, {3e38F, INFINITY, 0.3F});
    advanceTo(200);
    dispatch(1, {3e38F, 0, 1});
    advanceTo(300);
    dispatch(1, {3e38F, 0, 1e7F});
    EXPECT_EQ(spread(0, 3), "inf/nan/4714045.000000");  // in double it would be 4714044.901497
    EXPECT_EQ(spread(0, 0), "0.000000/0.000000/0.000000");
    EXPECT_EQ(spread(3, 2), "-0.000000/-0.000000/-0.000000");
    EXPECT_EQ(spread(3, 20), "0.000000/0.000000/0.000000");
    EXPECT_EQ(spread(-2147483647 - 1, 2147483647).substr(0, 4), "inf/");
}

TEST_F(WechatProxExceptionTest, TheDayIsReportedUnlessTheResetOvertakesTheReport) {
    setProperty(kRecord, "3_1_7_12");
    advanceTo(2000);
    mMonitor->notifyDayNight();
    mMonitor->notifyDayNight();
    play("2000 + 2000 - 2000 - 3000 +");  // one save for both ends
    const std::string report =
            "2000 N273|10013 invalid:1&status:{\t\"lock\" : \"7\",\t\"near\" : \"12\"}&total:3";
    EXPECT_EQ(taken(), (Lines{report, report, std::string("2000 ") + kRecord + "=3_1_7_12"}));

    mMonitor->notifyDayNight();
    mMonitor->resetWechatCount();
    mMonitor->resetWechatCount();
    advanceTo(3000);
    EXPECT_EQ(taken(), (Lines{std::string("3000 ") + kRecord + "=0_0_0_0"}));
}

TEST_F(WechatProxExceptionTest, CountersWrapAndEveryTotalButZeroIsReported) {
    setProperty(kRecord, "2147483647_2147483646_2147483647_2147483647");
    advanceTo(2000);
    play("2000 v1 2000 + 2000 D 2000 d 2000 p0 4000 -");
    mMonitor->notifyDayNight();
    play("5000 v1");
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[1],
              std::string("4000 ") + kRecord + "=-2147483648_2147483647_-2147483648_-2147483648");
    EXPECT_EQ(
            lines[2],
            "4000 N273|10013 invalid:2147483647&status:{\t\"lock\" : \"-2147483648\",\t\"near\" : "
            "\"-2147483648\"}&total:-2147483648");
}

TEST_F(WechatProxExceptionTest, AStoredRecordIsTakenIfItHasFourPieces) {
    const std::pair<const char*, const char*> cases[] = {
            {"1_2_3_4_5", "1_2_3_4"},
            {"5_6_7", "1_2_3_4"},
            {"", "1_2_3_4"},
            {"5_6_7_", "5_6_7_0"},
            {"-5_x_ 7y_99999999999", "-5_0_7_2147483647"}};
    for (const auto& [stored, loaded] : cases) {
        setProperty(kRecord, stored);
        mMonitor->initialize();
        EXPECT_EQ(counters(), loaded) << stored;
    }
}

TEST_F(WechatProxExceptionTest, TakesModeAndStateFromWholeNotificationsOfTheirKinds) {
    const auto notify = [this](std::vector<int> values) {
        mMonitor->setNotification(listOf(values));
    };
    notify({});
    notify({7, 1, 1, 1, 1, 1, 1});
    notify({6, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1});
    EXPECT_FALSE(mMonitor->isHandSetOrSpeaker());
    notify({7, 0, 0, 0, 0, 0, 0, 2});
    notify({10, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1});
    EXPECT_TRUE(mMonitor->isHandSetOrSpeaker());
    play("0 + 100 p0 150 p5");
    notify({10, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0});
    play("300 p0 400 -");
    EXPECT_EQ(counters(), "1_0_0_1");
}

}  // namespace
}  // namespace android
