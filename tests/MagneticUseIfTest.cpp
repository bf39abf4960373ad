#include "usage/MagneticUseIf.h"

#include <regex>
#include <sstream>

#include "core/Log.h"
#include "tests/DeviceTest.h"

namespace android {
namespace {

const char* const kProperties[] = {"persist.sys.fc_oriut",    "persist.sys.uc_oriut",
                                   "persist.sys.oc_oriut",    "persist.sys.sc_oriut",
                                   "persist.sys.total_oriut", "persist.sys.ds_oriut"};

class MagneticUseIfTest : public DeviceTest {
protected:
    /**
     * Plays pairs of a time and what the host does then: "10 +a" enables, "20 -a" disables for
     * "a/op", "30 c2" is a charge state, "40 d7" the day counter. Times are seconds after 1 s.
     */
    void play(const std::string& steps) {
        std::istringstream stream(steps);
        double second = 0;
        std::string what;
        while (stream >> second >> what) {
            advanceTo(1000 + second * 1000);
            const std::string rest = what.substr(1);
            if (what[0] == '+') mUse->setOrientationEnable(rest, "op");
            if (what[0] == '-') mUse->setOrientationDisable(rest, "op");
            if (what[0] == 'c') mUse->sendChargeState(std::stoi(rest));
            if (what[0] == 'd') mUse->sendUsedTime(std::stoi(rest));
        }
    }

    /** The totals as they would be stored: fast, USB, other, shock, all, days. */
    std::string totals() {
        mUse->setPersistStatistics();
        std::string text;
        for (const char* name : kProperties) text += property(name) + ' ';
        return text;
    }

    /** What the daily list reports, a line each: fast, USB, other and total seconds. */
    Lines reported() {
        taken();
        mUse->recordPkgInfoTally();
        Lines lines;
        static const std::regex kEntry(
                R"re("fastChargeTime" : "(.*?)",\s*"otherChargeTime" : "(.*?)",\s*)re"
                R"re("pkg" : "(.*?)",\s*"totalTime" : "(.*?)",\s*"usbChargeTime" : "(.*?)")re");
        for (const std::string& event : taken()) {
            std::sregex_iterator entry(event.begin(), event.end(), kEntry);
            for (; entry != std::sregex_iterator(); ++entry) {
                lines.push_back(entry->format("$3 $1 $5 $2 $4"));
            }
        }
        return lines;
    }

    MagneticUseIf* const mUse = MagneticUseIf::getInstance();
};

struct Use {
    const char* steps;
    const char* totals;  // fast, USB, other, shock, all, days
    Lines connections;   // fast, USB, other, total
};

class UseTest : public MagneticUseIfTest, public ::testing::WithParamInterface<Use> {};

TEST_P(UseTest, IsBookedToTheTotalsAndToTheConnections) {
    play(GetParam().steps);
    EXPECT_EQ(totals(), GetParam().totals);
    EXPECT_EQ(reported(), GetParam().connections);
}

const Use kUses[] = {
        // Connections overlap; two enables of one go on as one.
        {"0 +a 10 +b 20.9 -a 40 -b", "0 0 0 0 40 0 ", {"b/op 0 0 0 30", "a/op 0 0 0 20"}},
        {"0 +a 10 +a 25 -a 40 -a", "0 0 0 0 40 0 ", {"a/op 0 0 0 40"}},
        {"0 c1 0 +a 10 +a 15 -a 30 -a", "30 0 0 0 30 0 ", {"a/op 30 0 0 30"}},
        {"0 c2 0 +a 0.9 -a 1 +a 2.9 -a", "0 1 0 0 1 0 ", {"a/op 0 1 0 1"}},
        // Charging begins and ends within the use; states but 1 to 3 are none.
        {"0 +a 10 c2 30 -a", "0 20 0 0 30 0 ", {"a/op 0 20 0 30"}},
        {"0 c1 0 +a 30 c0 50 -a", "30 0 0 0 50 0 ", {"a/op 30 0 0 50"}},
        {"0 c4 0 +a 10 c-1 20 c0 30 -a", "0 0 0 0 30 0 ", {"a/op 0 0 0 30"}},
        // Another kind of charging takes the whole of the one span, and restarts the other.
        {"0 c1 0 +a 100 c2 150 -a", "0 150 0 0 150 0 ", {"a/op 0 50 0 150"}},
        // A charging state that is repeated drops what had run up for the connection.
        {"0 c1 0 +a 20 c1 30 -a", "30 0 0 0 30 0 ", {"a/op 10 0 0 30"}},
        // A state of no charging that is repeated books the same time again...
        {"0 c1 0 +a 30 c0 40 c0 50 -a", "30 0 0 0 50 0 ", {"a/op 70 0 0 50"}},
        // ...or all the time since the device booted, if the span never began, ...
        {"0 c3 5 c0 10 +a 20 c0 30 -a", "0 0 0 0 20 0 ", {"a/op 0 0 21 20"}},
        // ...or since an earlier one of the connection began.
        {"0 c3 0 +a 10 -a 20 c0 30 +a 40 c0 50 -a", "0 0 10 0 30 0 ", {"a/op 0 0 40 30"}},
        // Without a use, and for connections that never began, nothing is booked.
        {"0 c1 10 c0 20 -a", "0 0 0 0 0 0 ", {}},
        // After a surplus disable the next enable starts no span of all together.
        {"0 -a 10 +a 20 -a 30 +b 40 +b 50 -b 60 -b",
         "0 0 0 0 10 0 ",
         {"b/op 0 0 0 30", "a/op 0 0 0 10"}},
        // Not charging, a second enable books no charge. The day counter counts upwards.
        {"0 c1 1 c0 2 +a 5 +a 6 -a 7 -a", "0 0 0 0 5 0 ", {"a/op 0 0 0 5"}},
        {"0 d5 1 d3 2 d5 3 d6 4 d-1", "0 0 0 0 0 6 ", {}},
        // What is still enabled is not reported; what was not enabled for a second is.
        {"0 +a 0 +b 0.5 -b", "0 0 0 0 0 0 ", {"b/op 0 0 0 0"}},
};

INSTANTIATE_TEST_SUITE_P(Steps, UseTest, ::testing::ValuesIn(kUses));

TEST_F(MagneticUseIfTest, TheTotalsAreReportedAndStoredOnceForEachNewDay) {
    const auto report = [](const char* days, const char* fast, const char* pkg, const char* total) {
        std::ostringstream text;
        text << "N273|10012 days:" << days << "&fastChargeTime:" << fast
             << "&otherChargeTime:0&pkg:" << pkg << "&shockAndChargeTime:0&totalTime:" << total
             << "&usbChargeTime:0";
        return text.str();
    };
    play("0 +a 9 -a 10 d5 10 d3 10 +a 11 +b 12 -b 15 -a 20 +b 21 -b 30 d4 30 c1 30 + 31 +c 32 -c");
    EXPECT_EQ(taken(), (Lines{"16000 " + report("3", "0", "a", "14"),
                              "16000 persist.sys.fc_oriut=0", "16000 persist.sys.uc_oriut=0",
                              "16000 persist.sys.oc_oriut=0", "16000 persist.sys.sc_oriut=0",
                              "16000 persist.sys.total_oriut=14", "16000 persist.sys.ds_oriut=3"}));
    play("40 -");  // no name: the last one stays
    EXPECT_EQ(taken(), (Lines{"41000 " + report("4", "10", "b", "25")}));
}

TEST_F(MagneticUseIfTest, TheTotalsAreLoadedAtBootAndStoredOnlyAfterwards) {
    setProperty("persist.sys.fc_oriut", "2147483647");
    setProperty("persist.sys.uc_oriut", "abc");
    setProperty("persist.sys.sc_oriut", "-99999999999");
    play("0 c2 0 +a 4 -a");
    mUse->sendBootShutdownRebootState(2);
    play("5 d0");
    EXPECT_EQ(taken(), (Lines{}));

    mUse->sendBootShutdownRebootState(1);
    mUse->sendBootShutdownRebootState(1);
    play("5 d0 10 c1 10 +a 13 -a");
    mUse->setOrientationTally("a");  // each posts the same store
    mUse->sendBootShutdownRebootState(0);
    play("13 d0");
    mUse->sendBootShutdownRebootState(3);
    mUse->setOrientationTally("a");
    play("13 d0");
    Lines lines = taken();
    ASSERT_EQ(lines.size(), 2 * (1 + std::size(kProperties)));
    lines.erase(lines.begin(), lines.end() - std::size(kProperties));
    EXPECT_EQ(lines,
              (Lines{"14000 persist.sys.fc_oriut=-2147483646", "14000 persist.sys.uc_oriut=4",
                     "14000 persist.sys.oc_oriut=0", "14000 persist.sys.sc_oriut=-2147483648",
                     "14000 persist.sys.total_oriut=3", "14000 persist.sys.ds_oriut=0"}));
}

TEST_F(MagneticUseIfTest, WithoutANameTheReportsAppIsUnknow) {
    play("0 d1 0 + 0.5 -");
    const Lines lines = taken();
    ASSERT_EQ(lines.size(), 1u) << "a span below a second brings the report too";
    EXPECT_NE(lines[0].find("&pkg:unknow&"), std::string::npos) << lines[0];
}

TEST_F(MagneticUseIfTest, ABucketTakesSecondsByItsNumberAndWraps) {
    mUse->sendUsedTime(1);
    for (const long bucket : {0L, 1L, 2L, 3L, 4L, 6L, -1L}) {
        mUse->calCurretUseTotalTime("a", 2147483647, static_cast<int>(bucket));
        mUse->calCurretUseTotalTime("a", bucket, static_cast<int>(bucket));
    }
    EXPECT_EQ(taken(), Lines{});
    mUse->calCurretUseTotalTime("a", -5, 5);
    EXPECT_EQ(taken().size(), 1u) << "the total's bucket reports the day";
    EXPECT_EQ(totals(), "-2147483648 -2147483647 -2147483646 -2147483645 -5 1 ");
}

TEST_F(MagneticUseIfTest, TellsEachStepInTheLogWhileItIsOn) {
    const auto during = [this](auto act) {
        taken();
        act();
        Lines lines = taken();
        for (std::string& line : lines) line = line.substr(line.find(' ') + 1);
        return lines;
    };
    const auto all = [&] {
        play("1 c2 1 d3 1 +a 3 c0 4 -a");
        mUse->sendBootShutdownRebootState(1);
        play("5 c0");
        mUse->sendBootShutdownRebootState(3);
        play("6 c0");
    };
    mLogSwitch = 1;
    const Lines lines = during(all);
    const Lines start{
            "log 3 currentPCState = 2 ,mLastPCState = 0 ",
            "log 3 mIsChargeState=1, mEnableNumbers=0, mBeginCountTime=0", "log 3 uds = 3",
            "log 3 Enable mEnableNumbers = 1",
            "log 3 mIsChargeState=1, mEnableNumbers=1, mBeginCountTime=0",
            "log 3 dealWithOrientationTotalTime mEnableNumbers = 1, mTotalBeginCountTime = 0",
            "log 3 currentPCState = 0 ,mLastPCState = 2 ",
            "log 3 mIsChargeState=0, mEnableNumbers=1, mBeginCountTime=1", "log 3 tt = 2, type = 2",
            "log 3 Disable mEnableNumbers = 0",
            "log 3 mIsChargeState=0, mEnableNumbers=0, mBeginCountTime=0",
            "log 3 dealWithOrientationTotalTime mEnableNumbers = 0, mTotalBeginCountTime = 1",
            "log 3 mUD=3, mLastUD=3, mLastRUD=0", "log 6 SDC Event = N273|10012",
            // NOLINTNEXTLINE(bugprone-suspicious-missing-comma): one text in two pieces
            ("N273|10012 days:3&fastChargeTime:0&otherChargeTime:0&pkg:a&shockAndChargeTime:0"
             "&totalTime:3&usbChargeTime:2"),
            "log 3 oritt == 3", "log 3 boot state = 1"};
    ASSERT_GT(lines.size(), start.size());
    EXPECT_EQ(Lines(lines.begin(), lines.begin() + static_cast<long>(start.size())), start);
    const std::string totals =
            "mZunoFastChargeUT=0, mUsbChargeUT=2, mOtherChargeUT=0, mShockAndChargeUT=0, "
            "mTotalOrientationUT=3, mTotalD=3";
    EXPECT_EQ(lines[start.size()], "log 3 set " + totals);
    EXPECT_EQ(lines[start.size() + 1], "persist.sys.fc_oriut=0");
    EXPECT_NE(std::find(lines.begin(), lines.end(), "log 3 get " + totals), lines.end());

    mLogSwitch = 0;
    for (const std::string& line : during(all)) EXPECT_NE(line.substr(0, 4), "log ") << line;
}

TEST_F(MagneticUseIfTest, ReportsTheFiftyLongestByNameAmongEqualsAndDropsTheOthers) {
    for (int i = 10; i < 70; ++i) {
        const std::string pkg = std::to_string(i);
        play(std::to_string(100 * i) + " +" + pkg);
        play(std::to_string(100 * i + i / 10) + " -" + pkg);
    }
    play("7000 +running");
    const Lines lines = reported();
    ASSERT_EQ(lines.size(), 50U);
    EXPECT_EQ(lines[0], "60/op 0 0 0 6");
    EXPECT_EQ(lines[1], "61/op 0 0 0 6");
    EXPECT_EQ(lines[49], "29/op 0 0 0 2");
    EXPECT_EQ(reported(), (Lines{}));

    play("7010 -running 7020 +lost");
    mUse->notifyMagReset();
    play("7030 -lost");
    EXPECT_EQ(reported(), (Lines{}));
    EXPECT_EQ(totals(), "0 0 0 0 230 0 ");  // these are not reset
}

}  // namespace
}  // namespace android
