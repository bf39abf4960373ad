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

    /** A session of a/b that begins now and lasts so long. */
    Lines playSession(double seconds) {
        flow->setProxEnable("a", "b");
        advanceTo(mNow += seconds * 1000);
        flow->setProxDisable("a", "b");
        return taken();
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

TEST_F(FlowingDataExceptionTest, SessionsOfSystemPackagesAreNotReported) {
    for (const char* name : {"com.android.incallui", "com.android.mms", "com.android.systemui",
                             "com.android.server.telecom", "my.com.zunophone"}) {
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
