#include "usage/RegisterInfo.h"

#include <json/json.h>

#include "tests/DeviceTest.h"
#include "usage/RegisterConnectionList.h"

namespace android {
namespace {

/** A span cannot begin at 0 of the clock, which means "not enabled": tests begin later. */
constexpr double kStartMs = 1000;

/** Drives one list, with times in seconds. Connections are named "PKG/PKG" by one name. */
class RegisterConnectionListTest : public DeviceTest {
protected:
    void enable(double second, const std::string& pkg, long long rate) {
        advanceTo(kStartMs + second * 1000);
        mList.update(pkg, pkg, true, rate);
    }

    void disable(double second, const std::string& pkg) {
        advanceTo(kStartMs + second * 1000);
        mList.update(pkg, pkg, false, 0);
    }

    void display(double second, int state) {
        advanceTo(kStartMs + second * 1000);
        mList.setDisplayState(state);
    }

    /** What the list reports, a line each: "a 10 s on 5 s at 20000" for the connection "a/a". */
    Lines reported() { return reported(&mList); }

    static Lines reported(RegisterConnectionList* list) {
        Lines lines;
        const std::string text = list->getRegisterConnectionInfo();
        EXPECT_EQ(text.find_first_of("\n\r"), std::string::npos);
        Json::Value root;
        EXPECT_TRUE(text.empty() || Json::Reader().parse(text, root));
        for (const Json::Value& entry : root["list"]) {
            const std::string key = entry["pkg"].asString();
            lines.push_back(key.substr(0, key.find('/')) + ' ' + entry["time"].asString() +
                            " s on " + entry["ontime"].asString() + " s at " +
                            entry["rate"].asString());
        }
        return lines;
    }

    RegisterConnectionList mList;
};

TEST_F(RegisterConnectionListTest, CreditsTimeToWhoeverSetsTheRate) {
    constexpr long long k2To32 = 1LL << 32;
    enable(0, "a", 2 * k2To32 + 20000);
    enable(10, "b", k2To32 + 5000);  // of a rate, the low 32 bits are shown
    disable(40.9, "b");
    disable(45.9, "a");
    EXPECT_EQ(reported(), (Lines{"b 30 s on 0 s at 5000", "a 15 s on 0 s at 20000"}));
    EXPECT_EQ(reported(), (Lines{}));
}

TEST_F(RegisterConnectionListTest, ARateMayBeAnyNumberAndTheSmallestIsTheCurrentOne) {
    const struct {
        long long first;
        long long second;
        Lines report;  // "a" from 0 s, "b" from 10 s to 30 s
    } kCases[] = {
            {1, 0, {"b 20 s on 0 s at 0", "a 10 s on 0 s at 1"}},
            {0, 1, {"a 30 s on 0 s at 0"}},
            {5, 4, {"b 20 s on 0 s at 4", "a 10 s on 0 s at 5"}},
            {4, 5, {"a 30 s on 0 s at 4"}},
            // -1 stands for none: any rate takes its place.
            {-1, 5, {"b 20 s on 0 s at 5", "a 10 s on 0 s at -1"}},
            {-2, -1, {"a 30 s on 0 s at -2"}},
            {-2, 5, {"a 30 s on 0 s at -2"}},
    };
    double second = 0;
    for (const auto& [first, other, report] : kCases) {
        SCOPED_TRACE(std::to_string(first) + " and " + std::to_string(other));
        RegisterConnectionList list;
        const auto update = [&](double at, const char* pkg, bool enable, long long rate) {
            advanceTo(kStartMs + (second + at) * 1000);
            list.update(pkg, pkg, enable, rate);
        };
        update(0, "a", true, first);
        update(10, "b", true, other);
        update(30, "b", false, 0);
        update(30, "a", false, 0);
        second += 100;
        EXPECT_EQ(reported(&list), report);
    }
}

TEST_F(RegisterConnectionListTest, CountsEnablesOfOneConnectionAndKeepsItsFirstRate) {
    enable(0, "a", 20000);
    enable(10, "a", 5000);  // lowers the current rate: "a" itself no longer holds it
    disable(20, "a");
    disable(30, "a");
    EXPECT_EQ(reported(), (Lines{"a 10 s on 0 s at 20000"}));

    disable(40, "a");  // unknown by now
    enable(50, "b", 5000);
    disable(60, "b");
    disable(70, "b");  // its count falls to -1, which the next enable makes 1
    enable(80, "b", 5000);
    disable(90, "b");
    EXPECT_EQ(reported(), (Lines{"b 20 s on 0 s at 5000"}));
}

TEST_F(RegisterConnectionListTest, CreditsOnlyOneOfSeveralAtTheCurrentRate) {
    enable(0, "a", 5000);
    enable(10, "b", 5000);
    enable(30, "c", 5000);
    mList.update("a", "a", false, 0);
    mList.update("b", "b", false, 0);
    mList.update("c", "c", false, 0);
    // 10 s were "a" alone; the next 20 s belong to "a" or to "b", whichever the table has first.
    const Lines lines = reported();
    EXPECT_TRUE(lines == (Lines{"a 30 s on 0 s at 5000"}) ||
                lines == (Lines{"b 20 s on 0 s at 5000", "a 10 s on 0 s at 5000"}));
}

TEST_F(RegisterConnectionListTest, CountsTheTimeThatTheDisplayIsOn) {
    enable(0, "a", 20000);
    display(5, 2);
    display(5.5, 2);
    display(45, 1);
    display(50, 3);
    display(60, 2);
    disable(70, "a");
    display(80, 2);
    enable(90, "b", 5000);
    display(95, 0);
    disable(100, "b");
    EXPECT_EQ(reported(), (Lines{"a 70 s on 50 s at 20000", "b 10 s on 5 s at 5000"}));

    display(100, 2);
    enable(100, "fast", 5000);
    enable(100, "slow", 20000);
    display(110, 1);  // ends the slow one's span too, which earns nothing
    disable(120, "fast");
    display(130, 3);
    disable(140, "slow");
    EXPECT_EQ(reported(), (Lines{"fast 20 s on 10 s at 5000", "slow 20 s on 0 s at 20000"}));
}

TEST_F(RegisterConnectionListTest, TheResetKeepsTheCurrentRateThatNobodyHolds) {
    enable(0, "a", 5000);
    mList.clear();
    enable(10, "b", 20000);
    disable(3610, "b");
    EXPECT_EQ(reported(), (Lines{}));
    enable(4000, "c", 5000);
    disable(4010, "c");  // ends at the rate: it is found anew, and the next one counts
    enable(4100, "d", 20000);
    disable(4120, "d");
    EXPECT_EQ(reported(), (Lines{"d 20 s on 0 s at 20000", "c 10 s on 0 s at 5000"}));
}

}  // namespace
}  // namespace android
