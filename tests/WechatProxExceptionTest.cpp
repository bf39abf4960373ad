#include "exception/WechatProxException.h"

#include <cmath>
#include <limits>

#include "core/Arithmetic.h"
#include "tests/LibraryTest.h"

namespace android {
namespace {

constexpr char kChat[] = "com.tencent.mm";
constexpr char kRecord[] = "persist.zuno.wechat.count.info";
constexpr float kFar = 5;
constexpr float kNear = 0;

class WechatProxExceptionTest : public LibraryTest {
protected:
    /** Times are milliseconds after the load of the stored counters. */
    void at(double ms) { advanceTo(2000 + ms); }

    void chat(double ms, bool enabled, int type = 8) {
        at(ms);
        mMonitor->enableSuccess(enabled, type, "com.tencent.mm.Call$1", kChat);
    }

    void display(double ms, bool enabled) {
        at(ms);
        mMonitor->enableSuccess(enabled, 8, "com.android.server.display.DisplayPowerController$3",
                                "android");
    }

    void proximity(double ms, float distance) { dispatch(ms, 8, {distance}); }
    void reading(double ms, float x, float y, float z) { dispatch(ms, 1, {x, y, z}); }

    void dispatch(double ms, int type, std::initializer_list<float> data) {
        at(ms);
        sensors_event_t event{};
        event.type = type;
        std::copy(data.begin(), data.end(), event.data);
        mMonitor->process(event);
    }

    void notify(int kind, size_t size, int last) {
        Vector<int> list;
        list.insertAt(-7, 0, size);
        if (size > 0) list.replaceAt(last, size - 1);
        if (size > 0) list.replaceAt(kind, 0);
        mMonitor->setNotification(list);
    }

    /** The counters as they would be stored: total, invalid, lock, near. */
    std::string counters() {
        mMonitor->updatePropertyValue();
        taken();
        return property(kRecord);
    }

    std::string spread(int from, int to) {
        float x, y, z;
        return mMonitor->getVariance(from, to, x, y, z);
    }

    WechatProxException* const mMonitor = WechatProxException::getInstance();
};

TEST_F(WechatProxExceptionTest, AWholeCallThatLocksUpIsReportedCountedAndStored) {
    setProperty(kRecord, "3_1_7_12");
    notify(7, 8, 2);
    chat(0, true);
    proximity(10, kFar);
    reading(20, 1, 9.5F, 0);
    reading(41, 2, 9.5F, 0);
    reading(62, 3, 9.5F, 3);
    proximity(1000, kNear);
    at(5000);
    EXPECT_EQ(taken(), (Lines{"3500 N273|10013 variance:0.816497/0.000000/1.414214"}));

    proximity(5000, kFar);
    proximity(5100, kNear);  // reported once a session
    display(5150, true);
    display(5160, true);
    display(5170, false);
    at(6000);
    chat(6000, false);
    mMonitor->notifyDayNight();
    mMonitor->notifyDayNight();
    at(6000);
    const std::string report =
            "8000 N273|10013 invalid:2&status:{\t\"lock\" : \"9\",\t\"near\" : \"14\"}&total:4";
    EXPECT_EQ(taken(), (Lines{std::string("8000 ") + kRecord + "=4_2_9_14", report, report}));
}

TEST_F(WechatProxExceptionTest, ANearPeriodReportsWhatItsLastCheckComputed) {
    struct {
        double nearMs;
        double reportMs;  // after the near; 0: none
    } const cases[] = {{50, 0},    {99.9, 0},  {100.1, 200}, {150, 200}, {250, 300},
                       {450, 500}, {499, 500}, {500.1, 500}, {3000, 500}};
    mMonitor->setVoiceMode(1);
    double start = 1000;
    for (const auto& [nearMs, reportMs] : cases) {
        chat(start, true);
        reading(start, 1, 2, 3);
        reading(start + 30, 2, 2, 3);
        proximity(start + 1000, kNear);
        proximity(start + 1000 + nearMs, kFar);
        reading(start + 1000 + nearMs, 100, 100, 100);  // does not change what was computed
        chat(start + 8000, false);
        const Lines lines = taken();
        ASSERT_EQ(lines.size(), reportMs == 0 ? 0U : 1U) << nearMs;
        if (reportMs != 0) {
            EXPECT_EQ(lines[0], std::to_string(static_cast<int>(3000 + start + reportMs)) +
                                        " N273|10013 variance:0.500000/0.000000/0.000000");
        }
        start += 9000;
        at(start);
        taken();
    }
    EXPECT_EQ(counters(), "9_7_0_9");
}

TEST_F(WechatProxExceptionTest, CountsAndChecksOnlyInAVoiceCallWithoutTheDisplaysLock) {
    struct {
        int voice, camera;
        bool displayHolds;
        bool reports;
        const char* counters;
    } const cases[] = {{1, 0, false, true, "1_1_0_1"},  {2, -1, false, true, "1_1_0_1"},
                       {1, 1, false, false, "0_0_0_0"}, {0, 0, false, false, "0_0_0_0"},
                       {3, 0, false, false, "0_0_0_0"}, {2, 0, true, false, "1_0_1_1"}};
    double start = 1000;
    for (const auto& [voice, camera, displayHolds, reports, counted] : cases) {
        notify(7, 12, voice);  // too long is as good: element 7 has -7 in it
        EXPECT_FALSE(mMonitor->isHandSetOrSpeaker());
        notify(7, 8, voice);
        notify(10, 12, camera);
        notify(7, 7, 1);
        notify(10, 11, 1);
        notify(6, 8, 1);
        notify(0, 0, 0);
        mMonitor->resetWechatCount();
        chat(start, true);
        display(start, displayHolds);
        proximity(start, kNear);
        at(start + 1000);
        EXPECT_EQ(taken().size(), reports ? 2U : 1U) << voice << ' ' << camera;  // with the reset's
        chat(start + 1000, false);
        EXPECT_EQ(counters(), counted) << voice << ' ' << camera;
        start += 2000;
    }
}

TEST_F(WechatProxExceptionTest, DistancesCountAsWholeNumbersAndOnlyWhenTheyChange) {
    mMonitor->setVoiceMode(1);
    proximity(0, kNear);  // no session
    chat(0, true);
    for (float distance : {5.99F, 5.0F, 0.9F, -0.9F, 0.0F, 7.0F, NAN, 3e9F, 0.5F}) {
        proximity(10, distance);
    }
    EXPECT_EQ(counters(), "0_0_0_3");
    at(109);
    proximity(109, -3e9F);  // starts the checks anew, which then find no near
    at(1000);
    EXPECT_EQ(taken(), (Lines{}));
    chat(1000, false);
    mMonitor->enableSuccess(false, 8, "x", "a.com.tencent.mm.b");  // a second end counts again
    EXPECT_EQ(counters(), "2_0_0_3");
    chat(1000, true);
    chat(1000, false);
    EXPECT_EQ(counters(), "2_0_0_3");
}

TEST_F(WechatProxExceptionTest, KeepsReadingsMoreThanTwentyMillisecondsApartUntilNear) {
    reading(0, 9, 9, 9);  // no session
    chat(0, true);
    reading(100, 1, 0, 0);
    reading(120, 2, 0, 0);
    EXPECT_EQ(spread(0, 2), "0.500000/0.000000/0.000000");
    reading(120.000001, 3, 0, 0);
    reading(140.000001, 4, 0, 0);
    EXPECT_EQ(spread(0, 2), "1.000000/0.000000/0.000000");
    proximity(200, kNear);
    reading(300, 5, 5, 5);
    EXPECT_EQ(spread(0, 2), "1.000000/0.000000/0.000000");
    chat(300, false, 1);
    EXPECT_EQ(spread(0, 2), "1.000000/0.000000/0.000000");
    chat(300, true, 1);
    EXPECT_EQ(spread(0, 20), "0.000000/0.000000/0.000000");
}

TEST_F(WechatProxExceptionTest, TheSpreadIsOfTheTwentyNewestReadingsSinceFar) {
    mMonitor->setVoiceMode(1);
    chat(0, true);
    for (int i = 0; i < 10; ++i) reading(100 + 30 * i, 1000, 0, 0);
    for (int i = 0; i < 20; ++i) reading(1000 + 30 * i, i % 2 == 0 ? 1.0F : 2.0F, 0.1F, 0);
    proximity(2000, kNear);
    proximity(2150, kFar);
    reading(2180, 7, 8, 9);
    proximity(2300, 3);
    chat(2500, true);  // a fresh session may report again
    proximity(2500, kNear);
    at(5000);
    EXPECT_EQ(taken(), (Lines{"4200 N273|10013 variance:0.500000/0.000000/0.000000",
                              "5000 N273|10013 variance:0.000000/0.000000/0.000000"}));
}

TEST_F(WechatProxExceptionTest, TheSpreadIsDefinedForEveryRangeAndReading) {
    chat(0, true);
    reading(100, 3e38F, INFINITY, 0.3F);
    reading(200, 3e38F, 0, 1);
    reading(300, 3e38F, 0, 1e7F);
    EXPECT_EQ(spread(0, 3), "inf/nan/4714045.000000");  // in double it would be 4714044.901497
    EXPECT_EQ(spread(0, 0), "0.000000/0.000000/0.000000");
    EXPECT_EQ(spread(3, 2), "-0.000000/-0.000000/-0.000000");
    EXPECT_EQ(spread(3, 20), "0.000000/0.000000/0.000000");
    EXPECT_EQ(spread(-2147483647 - 1, 2147483647).substr(0, 4), "inf/");
}

TEST_F(WechatProxExceptionTest, AReportThatTheResetOvertakesFindsNothing) {
    setProperty(kRecord, "3_1_7_12");
    at(0);
    mMonitor->notifyDayNight();
    mMonitor->resetWechatCount();
    mMonitor->resetWechatCount();
    at(0);
    EXPECT_EQ(taken(), (Lines{std::string("2000 ") + kRecord + "=0_0_0_0"}));
}

/** What is stored, and what it is loaded as. */
class StoredRecordTest : public WechatProxExceptionTest,
                         public ::testing::WithParamInterface<std::pair<const char*, const char*>> {
};

TEST_P(StoredRecordTest, IsTakenIfItHasFourPieces) {
    setProperty(kRecord, GetParam().first);
    at(0);
    EXPECT_EQ(counters(), GetParam().second);
}

INSTANTIATE_TEST_SUITE_P(Texts, StoredRecordTest,
                         ::testing::Values(std::pair("", "0_0_0_0"), std::pair("5_1_2", "0_0_0_0"),
                                           std::pair("5_1_2_", "5_1_2_0"),
                                           std::pair("-5_x_ 7y_99999999999_9",
                                                     "-5_0_7_2147483647")));

TEST(ArithmeticTest, AFloatThatDoesNotFitTruncatesToTheNearestNumber) {
    constexpr int32_t kMin = std::numeric_limits<int32_t>::min();
    constexpr int32_t kMax = std::numeric_limits<int32_t>::max();
    const std::pair<float, int32_t> cases[] = {
            {-0.99F, 0},      {5.99F, 5},        {2147483520.0F, 2147483520},
            {0x1p31F, kMax},  {-0x1p31F, kMin},  {-2147483904.0F, kMin},
            {INFINITY, kMax}, {-INFINITY, kMin}, {NAN, 0},
            {-NAN, 0}};
    for (const auto& [value, expected] : cases) EXPECT_EQ(truncateToInt32(value), expected);
}

}  // namespace
}  // namespace android
