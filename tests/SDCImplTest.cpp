#include "core/SDCImpl.h"

#include <map>
#include <regex>
#include <set>
#include <utility>

#include "clock/VirtualClock.h"
#include "day/Payload.h"
#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "exception/WechatProxException.h"
#include "platform/Telemetry.h"
#include "rgb/RgbShot.h"
#include "tests/DeviceTest.h"
#include "tests/Locks.h"

namespace android {
namespace {

class SDCImplTest : public DeviceTest {
protected:
    /** Enables or disables a sensor at a second after 1 s: a span cannot begin at 0. */
    void connect(double second, bool enabled, int type, const char* pkg) {
        advanceTo(1000 + second * 1000);
        mSdc->enableSuccess(enabled, type, pkg, "op", 1000);
    }

    void notify(std::initializer_list<int> values) { mSdc->setNotification(listOf(values)); }

    /** Gives every module something to report, from `second` on. */
    void fillModules(double second) {
        for (const int type : {1, 3, 4}) connect(second, true, type, "a");
        for (const int type : {1, 3, 4}) connect(second + 5, false, type, "a");
        setProperty("persist.zuno.rgb.shot.count", "5");
        RgbShot::getInstance()->initRgbShotCount();
        setProperty("persist.zuno.ultra.phone.enable.count", "1");
        UltraException::getInstance()->initUltraSoundCount();
        setProperty("persist.zuno.flow.detect.count", "0,0,1,0,0,0");
        FlowingDataException::getInstance()->initDetectCount();
        setProperty("persist.zuno.wechat.count.info", "1_0_0_0");
        WechatProxException::getInstance()->initialize();
        taken();
    }

    void reportAll() {
        mSdc->putRgbShotTally(7);
        mSdc->putPhoneOpenUltraTally(7);
        mSdc->notifySdcClock(8);
        mSdc->notifySdcClock(23);
    }

    SDCImpl* const mSdc = SDCImpl::getInstance();
};

/** The connections of a list in an event, each with one of its values: "t1/op 10". */
Lines listed(const std::string& event, const std::string& key) {
    const std::regex entry("\"" + key + R"re(" : "(.*?)",\s*"pkg" : "(.*?)")re");
    Lines lines;
    for (std::sregex_iterator it(event.begin(), event.end(), entry), end; it != end; ++it) {
        lines.push_back(it->format("$2 $1"));
    }
    return lines;
}

TEST_F(SDCImplTest, RoutesSevenSensorTypesToThreeDailyReports) {
    for (int type : {0, 1, 2, 3, 4, 5, 7, 9, 10, 11, 14, 15, 16, 17, 34, 35, 36, -1}) {
        const std::string pkg = "t" + std::to_string(type);
        connect(type + 1, true, type, pkg.c_str());
        connect(type + 2, false, type, pkg.c_str());
    }
    mSdc->notifySdcClock(23);
    EXPECT_EQ(taken(), (Lines{}));  // posted, not sent at once
    advanceTo(60'000);
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_NE(lines[0].find("N273|10012 info:{"), std::string::npos);
    EXPECT_EQ(listed(lines[0], "otherChargeTime"), (Lines{"t11/op 0", "t3/op 0"}));
    EXPECT_NE(lines[1].find("N273|10003 app_list:{"), std::string::npos);
    EXPECT_EQ(listed(lines[1], "ontime"), (Lines{"t1/op 0", "t35/op 0"}));
    EXPECT_NE(lines[2].find("N273|10004 app_list:{"), std::string::npos);
    EXPECT_EQ(listed(lines[2], "ontime"), (Lines{"t16/op 0", "t4/op 0"}));
}

/**
 * Reports of the modules, a letter each: "R" and "U" of screen samples and ultrasonic calls, "F" of
 * detected exceptions, "M" of orientation use, "W" of chat calls, "A" and "G" of registrations.
 */
std::string letters(const Lines& lines) {
    const std::pair<const char*, char> kReports[] = {
            {"N273|10009 count:5", 'R'}, {"N273|10011 ", 'U'},         {"N273|10005 ", 'F'},
            {"N273|10012 info:", 'M'},   {"N273|10013 invalid:", 'W'}, {"N273|10003 app_list", 'A'},
            {"N273|10004 app_list", 'G'}};
    std::string result;
    for (const std::string& line : lines) {
        for (const auto& [text, letter] : kReports) {
            if (line.find(text) != std::string::npos) result += letter;
        }
    }
    return result;
}

TEST_F(SDCImplTest, AnHourlyCallActsAtItsHoursOnly) {
    using Sent = const char*;
    using Left = const char*;
    const struct {
        const char* name;
        void (SDCImpl::*call)(int);
        std::map<int, std::pair<Sent, Left>> effects;  // by hour
    } kCases[] = {
            {"clock", &SDCImpl::notifySdcClock, {{8, {"F", "RUMWAG"}}, {23, {"MWAG", "RUFW"}}}},
            {"reset", &SDCImpl::notifySdcReset, {{8, {"", "RUMWAG"}}, {23, {"", "RUF"}}}},
            {"samples", &SDCImpl::putRgbShotTally, {{7, {"R", "UFMWAG"}}}},
            {"reset of samples", &SDCImpl::notifyRgbShotReset, {{7, {"", "UFMWAG"}}}},
            {"calls", &SDCImpl::putPhoneOpenUltraTally, {{7, {"U", "RFMWAG"}}}},
            {"reset of calls", &SDCImpl::notifyUltraReset, {{7, {"", "RFMWAG"}}}},
    };
    UltraException::getInstance();
    advanceTo(5000);  // it has loaded its counts
    double second = 10;
    for (const auto& [name, call, effects] : kCases) {
        for (const int hour : {-1, 0, 6, 7, 8, 9, 22, 23, 24}) {
            SCOPED_TRACE(std::string(name) + " at " + std::to_string(hour));
            fillModules(second);
            (mSdc->*call)(hour);
            advanceTo(1000 * (second += 20));
            const auto effect = effects.find(hour);
            const bool acts = effect != effects.end();
            const Lines lines = taken();
            EXPECT_EQ(letters(lines), acts ? effect->second.first : "");
            EXPECT_TRUE(acts || lines.empty()) << lines[0];
            reportAll();
            advanceTo(1000 * (second += 20));
            EXPECT_EQ(letters(taken()), acts ? effect->second.second : "RUFMWAG");
        }
    }
}

/**
 * Telemetry is somebody else's code: it may last, and come back. So no lock is held meanwhile, and
 * what is zeroed, stored or posted for an event comes behind it.
 */
TEST_F(SDCImplTest, EveryEventIsSentWithNothingHeldAndBeforeAllThatFollowsIt) {
    std::set<trace::EventKind> kinds;
    bool isHosts = true;  // the thread that sends; the worker's otherwise
    const auto advance = [&](double ms) {
        isHosts = false;
        advanceTo(ms);
        isHosts = true;
        taken();
    };
    platform::observeEvents([&](const char*, const char* id, const char* payload) {
        SCOPED_TRACE(std::string(id) + ' ' + payload);
        ASSERT_EQ(locksHeld(), 0);
        const trace::EventKind kind = day::takeApart(id, payload).kind;
        // A failure and the day have one form.
        EXPECT_TRUE(kinds.insert(kind).second || kind == trace::EventKind::kUltrasonic);
        if (std::exchange(isHosts, false)) {
            virtual_clock::settle();
            for (const bool on : {true, false}) mSdc->enableSuccess(on, 3, "b", "op", 0);
            isHosts = true;
        }
        EXPECT_EQ(taken(), Lines{});
        if (kind == trace::EventKind::kScreenSamples) RgbShot::getInstance()->updateRgbShotCount();
    });
    UltraException::getInstance();
    advance(5000);
    fillModules(10);
    setProperty("persist.zuno.flow.detect.count", "1,1,1,1,1,1");
    FlowingDataException::getInstance()->initDetectCount();
    notify({7, 0, 0, 0, 0, 0, 0, 1});
    mSdc->enableSuccess(true, 8, "Call", "com.tencent.mm", 0);
    sensors_event_t near{};
    near.type = SENSOR_TYPE_PROXIMITY;
    mSdc->process(near);
    advance(3'000'000);
    mSdc->enableSuccess(false, 8, "Call", "com.tencent.mm", 0);
    advance(3'100'000);
    mSdc->sendUsedTime(2);
    mSdc->enableSuccess(true, 3, "a", "op", 0);
    mSdc->enableSuccess(false, 3, "a", "op", 0);
    advance(3'200'000);
    UltraException::getInstance()->doAction(4, {});
    advance(4'000'000);
    mSdc->putRgbShotTally(7);
    EXPECT_EQ(property("persist.zuno.rgb.shot.count"), "5") << "zeroed only behind the event";
    taken();
    mSdc->putPhoneOpenUltraTally(7);
    for (const int hour : {8, 23}) {
        advance(4'000'000 + hour * 1000);
        mSdc->notifySdcClock(hour);
    }
    advance(5'000'000);
    EXPECT_EQ(kinds.size(), std::size(trace::kEventForms));
    EXPECT_EQ(kinds.count(trace::EventKind::kUnknown), 0u);
}

TEST_F(SDCImplTest, ACleanUpIsADisable) {
    for (const int type : {1, 3}) connect(0, true, type, "pkg");
    mSdc->enableSuccess(true, 1, "slow", "op", (1LL << 32) + 1);  // in 32 bits it would be faster
    mSdc->enableSuccess(true, 8, "Call", "com.tencent.mm", 0);
    advanceTo(6000);
    for (const int type : {1, 3}) mSdc->cleanupConnection(String8("pkg"), String8("op"), type);
    mSdc->cleanupConnection(String8("Call"), String8("com.tencent.mm"), 8);
    mSdc->notifySdcClock(23);
    advanceTo(7000);
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0], "6000 persist.zuno.wechat.count.info=0_0_0_0");
    EXPECT_EQ(listed(lines[1], "otherChargeTime"), (Lines{"pkg/op 0"}));
    EXPECT_EQ(listed(lines[2], "ontime"), (Lines{"pkg/op 0"}));
}

TEST_F(SDCImplTest, AResetThatFollowsItsTickAtOnceOvertakesTheReport) {
    for (int type : {1, 3, 4}) connect(0, true, type, "pkg");
    for (int type : {1, 3, 4}) connect(10, false, type, "pkg");
    mSdc->notifySdcClock(23);
    mSdc->notifySdcReset(23);
    advanceTo(20'000);
    EXPECT_EQ(taken(), (Lines{"11000 persist.zuno.wechat.count.info=0_0_0_0"}));
}

TEST_F(SDCImplTest, TakesTheDisplayStateFromWholeNotificationsOfItsKind) {
    for (int type : {1, 4}) connect(0, true, type, "pkg");
    notify({});
    notify({2, 2});
    advanceTo(2000);
    notify({2, 0, 2});
    advanceTo(11'000);
    notify({3, 0, 1});
    notify({2, 1});
    advanceTo(21'000);
    notify({2, 2, 1, 2});
    for (int type : {1, 4}) connect(30, false, type, "pkg");
    mSdc->notifySdcClock(23);
    advanceTo(40'000);
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 2u);
    for (const std::string& line : lines) EXPECT_EQ(listed(line, "ontime"), (Lines{"pkg/op 19"}));
}

}  // namespace
}  // namespace android
