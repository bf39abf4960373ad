#include "exception/FlowingDataException.h"

#include <limits>
#include <map>
#include <tuple>
#include <utility>

#include "platform/Telemetry.h"
#include "tests/DeviceTest.h"

namespace android {
namespace {

constexpr char kRecord[] = "persist.zuno.flow.detect.count";

class FlowingDataExceptionTest : public DeviceTest {
protected:
    void load(const std::string& record) {
        setProperty(kRecord, record);
        flow->initDetectCount();
    }

    /** What a disable of a/b after so many seconds reports. */
    std::string disableAfter(double seconds) {
        advanceTo(mNow += seconds * 1000);
        flow->setProxDisable("a", "b");
        const Lines lines = taken();
        return lines.empty() ? "" : lines[0].substr(lines[0].find(' ') + 1);
    }

    FlowingDataException* const flow = FlowingDataException::getInstance();
    double mNow = 0;
};

TEST_F(FlowingDataExceptionTest, EachSensorTypeCountsForItsFamilyOnly) {
    const std::map<int, size_t> slots{{1, 0}, {9, 0},  {10, 0}, {35, 0}, {4, 1}, {16, 1},
                                      {2, 2}, {14, 2}, {5, 3},  {3, 4},  {11, 5}};
    for (int type = -1; type < 40; ++type) {
        SCOPED_TRACE(type);
        load("0,0,0,0,0,0");
        flow->notifyUpdateDetectCount(type);
        advanceTo(mNow += 11'000);
        std::string record = "0,0,0,0,0,0";
        std::string eventId = "-1";
        if (const auto found = slots.find(type); found != slots.end()) {
            record[2 * found->second] = '1';
            eventId = "N273|1000" + std::to_string(found->second + 3);
        }
        EXPECT_EQ(property(kRecord), record);
        EXPECT_EQ(flow->getEventID(type), eventId);
    }
}

TEST_F(FlowingDataExceptionTest, ARunOfNotificationsEndsAfterElevenQuietSeconds) {
    for (const double at : {0, 5000, 15'999, 26'999}) {
        advanceTo(at);
        flow->notifyUpdateDetectCount(1);
    }
    advanceTo(100'000);
    EXPECT_EQ(taken(), (Lines{"26999 persist.zuno.flow.detect.count=1,0,0,0,0,0",
                              "37999 persist.zuno.flow.detect.count=2,0,0,0,0,0"}));
}

TEST_F(FlowingDataExceptionTest, OnlyARecordOfSixFieldsIsLoaded) {
    const Lines reset{"0 log 3 sd resetDetectCount",
                      "0 persist.zuno.flow.detect.count=0,0,0,0,0,0"};
    const std::tuple<const char*, const char*, Lines> cases[] = {
            {"1,2,3,4,5,6", "1,3,3,4,5,6", {}},
            {",1,,2,3,4,5,6,", "1,3,3,4,5,6", {}},
            {"x, -7y,+3,99999999999,-99999999999,0x6", "0,-6,3,2147483647,-2147483648,0", {}},
            {"1,2,3", "0,1,0,0,0,0", reset},
            {"1,2,3,4,5,6,7", "0,1,0,0,0,0", reset},
            {",,", "0,1,0,0,0,0", reset},
            {"", "0,1,0,0,0,0", reset},
            {"UnknowN,2,3,4,5,6", "0,1,0,0,0,0", reset},
    };
    for (const auto& [stored, counted, lines] : cases) {
        SCOPED_TRACE(stored);
        load("9,9,9,9,9,9");
        taken();
        load(stored);
        EXPECT_EQ(taken(), lines);
        flow->updateDetectCountByType(3);
        EXPECT_EQ(property(kRecord), counted);
    }
}

TEST_F(FlowingDataExceptionTest, ACountStopsOneBeforeTheLargestNumberAndAFullOneIsNotStored) {
    const struct {
        const char* stored;
        const char* once;
        const char* twice;
    } kCases[] = {{"2147483644", "2147483645", "2147483646"},
                  {"2147483645", "2147483646", "2147483646"},
                  {"2147483646", "2147483646", "2147483646"},
                  {"2147483647", "2147483647", "2147483647"},
                  {"-2147483648", "-2147483647", "-2147483646"},
                  {"-1", "0", "1"}};
    for (const auto& [stored, once, twice] : kCases) {
        const auto record = [](const char* count) { return "0,0,0,0,0," + std::string(count); };
        load(record(stored));
        for (const auto& [before, after] : {std::pair(stored, once), std::pair(once, twice)}) {
            taken();
            flow->updateDetectCountByType(7);
            Lines expected{std::string("0 ") + kRecord + '=' + record(after)};
            if (before == std::string(after)) expected.clear();
            EXPECT_EQ(taken(), expected) << before;
        }
    }
    for (const int code : {-1, 1, 8, 9, 16}) flow->updateDetectCountByType(code);
    EXPECT_EQ(taken(), Lines{});
}

TEST_F(FlowingDataExceptionTest, TheMorningsReportsPrecedeTheFirstOfTheResets) {
    const auto reset = [](const std::string& ms) {
        return Lines{ms + " log 3 sd resetDetectCount", ms + ' ' + kRecord + "=0,0,0,0,0,0"};
    };
    Lines expected{"0 N273|10003 reason:1", "0 N273|10005 reason:-3", "0 N273|10006 reason:4",
                   "0 N273|10007 reason:5", "0 N273|10008 reason:2147483647"};
    for (const char* ms : {"0", "2000"}) {
        for (const std::string& line : reset(ms)) expected.push_back(line);
    }
    load("1,0,-3,4,5,2147483647");
    flow->putDetectTally();
    advanceTo(10'000);
    EXPECT_EQ(taken(), expected);

    flow->putDetectTally();
    flow->notifyFlowReset();  // replaces all resets that wait
    advanceTo(11'999);
    EXPECT_EQ(taken(), Lines{});
    flow->notifyFlowReset();
    advanceTo(20'000);
    EXPECT_EQ(taken(), reset("13999"));
}

TEST_F(FlowingDataExceptionTest, ACountThatFallsBetweenTheTwoResetsIsLost) {
    flow->notifyUpdateDetectCount(5);
    advanceTo(11'000);
    flow->notifyUpdateDetectCount(2);
    advanceTo(21'999);
    flow->putDetectTally();
    advanceTo(30'000);
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 7u);
    EXPECT_EQ(lines[1], "21999 N273|10006 reason:1");
    EXPECT_EQ(lines[4], std::string("22000 ") + kRecord + "=0,0,1,0,0,0");
    EXPECT_EQ(lines[6], std::string("23999 ") + kRecord + "=0,0,0,0,0,0");
}

TEST_F(FlowingDataExceptionTest, AFamilysReportCanBeAskedForByItsCode) {
    load("1,2,3,4,5,6");
    std::map<int, const char*> events{{10, "0 N273|10003 reason:1"}, {11, "0 N273|10004 reason:2"},
                                      {12, "0 N273|10005 reason:3"}, {13, "0 N273|10006 reason:4"},
                                      {14, "0 N273|10007 reason:5"}, {15, "0 N273|10008 reason:6"}};
    for (int code = -1; code < 20; ++code) {
        flow->notifyPutTally(code);
        EXPECT_EQ(taken(), events.count(code) > 0 ? Lines{events[code]} : Lines{}) << code;
    }
}

TEST_F(FlowingDataExceptionTest, ASessionIsReportedIfItLastsLongerThanHalfAnHour) {
    const auto enable = [this] { flow->setProxEnable("a", "b"); };
    enable();
    EXPECT_EQ(disableAfter(1800.999'999), "");
    enable();
    EXPECT_EQ(disableAfter(1801), "N273|10010 pkg:a/b&time:1801");
    enable();
    advanceTo(mNow += 1000);
    enable();
    EXPECT_EQ(disableAfter(1800.9), "") << "still held once";
    enable();
    EXPECT_EQ(disableAfter(0.9), "");
    EXPECT_EQ(disableAfter(0.9), "N273|10010 pkg:a/b&time:1802") << "a nesting cuts to seconds";
    EXPECT_EQ(disableAfter(2000), "");
    enable();
    EXPECT_EQ(disableAfter(1800), "") << "nothing of the last session is left";
}

TEST_F(FlowingDataExceptionTest, SessionsOfSystemPackagesAreNotReported) {
    for (const char* name : {"com.android.incallui", "com.android.mms", "com.android.systemui",
                             "com.android.server", "my.com.zunophone"}) {
        flow->setProxTally(name, "b", 5);
        flow->setProxTally("a", name, 5);
    }
    EXPECT_EQ(taken(), Lines{});
    flow->setProxTally("com.android.mm", "com.Zuno", 5);
    EXPECT_EQ(taken(), (Lines{"0 N273|10010 pkg:com.android.mm/com.Zuno&time:5"}));
}

TEST_F(FlowingDataExceptionTest, AClientIsFreeToCallWhileItsSessionIsReported) {
    static FlowingDataException* const module = flow;
    static int reports = 0;
    flow->setProxEnable("a/b", "c");
    advanceTo(1'801'000);
    platform::observeEvents([](auto...) {
        ++reports;
        module->setProxEnable("a", "b/c");
    });
    flow->setProxDisable("a", "b/c");  // joined, the names are the same
    advanceTo(3'602'000);
    flow->setProxDisable("a/b", "c");
    EXPECT_EQ(reports, 2);
}

}  // namespace
}  // namespace android
