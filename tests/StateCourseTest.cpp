#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "tests/Captures.h"

namespace {

const std::string kReset = "0 (1) RESET:TIME: 2024-05-02-09-00-00\n";
const std::string kComplete = "0 (2) 050 80000000 status=charging plug=usb +running\n";

struct Case {
    const char* what;
    std::string history;
    std::string log;
    const char* states;
};

/** A line of the event log at a time of the report's day. */
std::string logged(const std::string& time, const std::string& entry) {
    return "05-02 " + time + "  1000   519   534 I " + entry + "\n";
}

class StateCourseTest : public ::testing::Test {
protected:
    static void check(const std::vector<Case>& cases) {
        for (const Case& each : cases) {
            const auto imported = importText(bugReport(each.history, each.log));
            EXPECT_EQ(imported.error, "") << each.what;
            EXPECT_EQ(statesOf(imported.trace), each.states) << each.what;
        }
    }
};

TEST_F(StateCourseTest, FollowsTheBatteryHistory) {
    check({
            {"what holds at the start, each change, the end of knowledge",
             kReset + kComplete +
                     "+1h00m01s999ms (2) 050 +screen\n"
                     "+1h30m00s000ms (2) 050 c0000000 plug=none +camera -screen +phone_in_call\n"
                     "+3h00m01s000ms (2) 050 +screen\n+3h00m02s000ms (2) 050 -screen\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:01 d2, 10:30:00 d1 p0 c1 t1, 12:00:00 c0 t0"},
            {"items match whole, and nothing in quotes does",
             kReset + kComplete +
                     "+1h (2) 050 +screen_doze screenwake=1:\"x +screen y\" Wake +running\n"
                     "+1h00m01s000ms (2) 050 +job=\"a\"b\" +camera \"c\" +screen=1 -camera, "
                     "+camera2\n"
                     "+1h00m02s000ms (2) 050 plug=dockx plug= +Screen\n"
                     "+1h00m03s000ms (2) 050 +screen unpaired=\" +camera\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:03 d2 c1, 12:00:00 d1 p0 c0"},
            {"unknown lines between",
             kReset + kComplete +
                     "  Details: cpu=1u+2s\n  /proc/stat=1 usr\n+59m (2) 50 +screen\n"
                     "+59m (x) 050 +screen\n59m (2) 050 +screen\n+59m1h (2) 050 +screen\n"
                     "+59m 050 +screen\n+1h01m00s000ms (2) 050 8000000 +screen\n",
             "", "09:59:50 d1 p2 c0 t0, 10:01:00 d2, 12:00:00 d1 p0"},
            {"kinds of plugs, of which all but two are one",
             kReset + kComplete +
                     "+1h00m01s000ms (2) 050 plug=dock\n+1h00m02s000ms (2) 050 plug=wireless\n"
                     "+1h00m03s000ms (2) 050 plug=ac\n+1h00m04s000ms (2) 050 plug=16\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:01 p3, 10:00:03 p1, 10:00:04 p3, 12:00:00 p0"},
            {"the last of a second counts, and only if it is a change",
             kReset + kComplete +
                     "+1h00m01s100ms (2) 050 +screen\n+1h00m01s900ms (2) 050 -screen\n"
                     "+1h00m02s100ms (2) 050 -screen\n+1h00m02s200ms (2) 050 +screen\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:02 d2, 12:00:00 d1 p0"},
            {"a time that goes back becomes the one before",
             kReset + kComplete +
                     "+1h10m00s000ms (2) 050 -camera\n-5s000ms (2) 050 +screen\n"
                     "+1h11m00s000ms (2) TIME: 2024-05-02-10-05-00\n"
                     "+1h12m00s000ms (2) 050 -screen\n+1h20m00s000ms (2) 050 +camera\n",
             "", "09:59:50 d1 p2 c0 t0, 10:14:00 c1, 12:00:00 p0 c0"},
            {"a prefix may be of milliseconds alone",
             kReset + kComplete + "+500ms (2) 050 +screen\n", "",
             "09:59:50 d2 p2 c0 t0, 12:00:00 d1 p0"},
            {"a prefix may be negative",
             kReset + kComplete +
                     "-10s000ms (2) TIME: 2024-05-02-10-00-00\n+5s000ms (2) 050 +screen\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:15 d2, 12:00:00 d1 p0"},
            {"each time is a new anchor",
             kReset + kComplete +
                     "+1d01h00m00s000ms (2) TIME: 2024-05-02-10-00-07\n"
                     "+1d01h00m02s000ms (2) 050 +screen\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:09 d2, 12:00:00 d1 p0"},
            {"a start takes the time that follows, and so do the lines between",
             kReset + kComplete +
                     "+1h (2) 050 +screen +camera +phone_in_call\n+1h00m05s000ms (8) START\n"
                     "+1h00m05s000ms (3) 050 plug=ac\n"
                     "+1h00m09s000ms (8) TIME: 2024-05-02-10-30-00\n"
                     "+1h00m10s000ms (2) 050 +screen\n",
             "",
             "09:59:50 d1 p2 c0 t0, 10:00:00 d2 c1 t1, 10:30:00 d1 p1 c0 t0, 10:30:01 d2, "
             "12:00:00 d1 p0"},
            {"a start without a time is left out, up to the next one",
             kReset + kComplete +
                     "+1h (2) 050 +screen +phone_in_call\n+1h00m05s000ms (8) START\n"
                     "+1h00m06s000ms (2) 050 plug=ac +camera\n+1h00m07s000ms (8) START\n"
                     "+1h00m09s000ms (8) TIME: 2024-05-02-10-30-00\n+2h (8) START\n"
                     "+2h (2) 050 +phone_in_call\n",
             "", "09:59:50 d1 p2 c0 t0, 10:00:00 d2 t1, 10:30:00 d1 t0, 12:00:00 p0"},
            {"lines before the first reset, start or time count for nothing",
             "0 (2) 050 plug=ac +screen\n+1s000ms (2) TIME: 2024-05-02-09-00-00\n"
             "+1h00m06s000ms (2) 050 +camera\n",
             "", "10:00:05 c1, 12:00:00 c0"},
    });
    const std::string local =
            "05-02 08:00:00.000 SHUTDOWN\n"
            "05-02 10:00:01.000 RESET:TIME: 2020-01-01-00-00-00\n"
            "  05-02 10:00:01.500 050 80000000 plug=usb\n"
            "05-02 10:00:05.999 050 +screen\n05-02 10:30:00.000 START\n"
            "05-02 12:00:01.000 050 +camera\n";
    std::string text = bugReport(local, "");
    text.replace(text.find("History ("), 8, "History [Format: 2] ");
    EXPECT_EQ(statesOf(importText(text).trace),
              "10:00:01 d1 p2 c0 t0, 10:00:05 d2, 10:30:00 d1, 12:00:00 p0");
}

TEST_F(StateCourseTest, FollowsTheEventLogWhereTheHistoryDoesNotRecord) {
    const std::string on = "screen_toggled: 1";
    const std::string off = "screen_toggled: 0";
    const auto charge = [](const char* plugged) {
        return std::string("battery_status: [2,2,1,") + plugged + ",Li-ion]";
    };
    check({
            {"before the first toggle the display was the opposite; of the plug nothing is known",
             "",
             logged("10:00:01.500", "am_kill : [0,1,a]") + logged("10:00:02.000", off) +
                     logged("10:00:03.000", "screen_toggled: 2") +
                     logged("10:00:04.000", charge("4")) + logged("10:00:05.000", on) +
                     logged("12:00:01.000", off),
             "10:00:01 d2, 10:00:02 d1, 10:00:04 p3, 10:00:05 d2, 12:00:00 d1 p0"},
            {"lines with and without a user, with blanks before the colon, or broken", "",
             "05-02 10:00:01.000   519   534 I screen_toggled   : 1\n"
             "05-02 10:00:02.000  logd   519   534 I screen_toggled: 0\n"
             "05-02 10:00:03.000  logd   519 I screen_toggled: 1\n" +
                     logged("10:00:04.000", "screen_toggled: 1x") +
                     logged("10:00:05.000", "x: screen_toggled: 1") +
                     logged("10:00:05.000", "x_screen_toggled: 1") +
                     logged("10:00:06.000", "battery_status: [2,2,1]"),
             "10:00:01 d2, 10:00:02 d1"},
            {"a time that goes back becomes the one before", "",
             logged("10:00:06.000", "x: 1") + logged("10:00:03.000", off) +
                     logged("10:00:07.000", charge("2")),
             "10:00:06 d1, 10:00:07 p2, 12:00:00 p0"},
            {"what the history says first held since the log's first line", kReset + kComplete,
             logged("08:59:55.000", "x: 1") + logged("09:00:00.000", off) +
                     logged("11:00:00.000", on),
             "09:59:50 d1 p2 c0 t0, 12:00:00 p0"},
            {"an overflow: the log's last values hold, also those from before it",
             kReset + kComplete +
                     "+1h00m10s000ms (2) *OVERFLOW*\n+1h00m20s000ms (2) 050 +camera\n" +
                     "+2h00m00s000ms (2) TIME: 2024-05-02-11-00-00\n" +
                     "+2h00m10s000ms (2) 050 plug=none\n",
             logged("10:00:05.000", on) + logged("10:00:06.000", charge("1")) +
                     logged("10:00:15.000", charge("8")) + logged("11:00:00.000", off),
             "09:59:50 d1 p2 c0 t0, 10:00:10 d2 p1, 10:00:15 p3, 11:00:10 p0, 12:00:00 d1"},
            {"a full battery: the plug stays, whatever the log says of it, and has said",
             kReset + kComplete + "+1h00m10s000ms (2) 100 status=full +screen\n" +
                     "+1h00m20s000ms (2) 100 plug=none -screen +camera\n",
             logged("10:00:06.000", charge("4")) + logged("10:00:12.500", off) +
                     logged("10:00:30.000", charge("0")) + logged("10:00:40.000", on),
             "09:59:50 d1 p2 c0 t0, 10:00:10 d2, 10:00:12 d1, 10:00:40 d2, 12:00:00 d1 p0"},
            {"a full battery that is not plugged pauses nothing, nor does one that charges",
             kReset + kComplete + "+1h00m10s000ms (2) 100 status=full plug=none\n" +
                     "+1h00m20s000ms (2) 100 +screen\n" +
                     "+1h00m30s000ms (2) 100 status=not-charging plug=ac\n" +
                     "+1h00m40s000ms (2) 100 -screen\n+1h00m50s000ms (2) 100 status=unknown\n" +
                     "+1h01m00s000ms (2) 100 +screen\n",
             "",
             "09:59:50 d1 p2 c0 t0, 10:00:10 p0, 10:00:20 d2, 10:00:30 p1, 10:00:40 d1, "
             "12:00:00 p0"},
            {"a time ends a pause, but not the status: the next record pauses again",
             kReset + kComplete + "+1h00m10s000ms (2) 100 status=full\n" +
                     "+1h10m00s000ms (2) TIME: 2024-05-02-10-10-00\n" +
                     "+1h10m01s000ms (2) 099 +screen\n+1h10m02s000ms (2) 099 +camera\n",
             "", "09:59:50 d1 p2 c0 t0, 10:10:01 d2, 12:00:00 d1 p0"},
            {"after a shutdown the display is off, whatever the log said last",
             kReset + kComplete + "+1h00m10s000ms (2) 050 +screen\n+1h00m20s000ms (2) SHUTDOWN\n",
             logged("10:00:10.000", on) + logged("10:00:11.000", charge("1")) +
                     logged("10:00:20.000", on) + logged("10:00:30.000", charge("2")),
             "09:59:50 d1 p2 c0 t0, 10:00:10 d2, 10:00:20 d1 p1, 10:00:30 p2, 12:00:00 p0"},
            {"the first record after a start names all, even where it does not count",
             kReset + "0 (2) *OVERFLOW*\n0 (2) 050 plug=usb +screen\n"
                      "+1s000ms (2) TIME: 2024-05-02-09-00-01\n+2s000ms (2) 050 plug=ac\n",
             "", "09:59:50 p1, 12:00:00 p0"},
            {"so does the first after a start, here before a time that ends a pause",
             kReset + kComplete + "+1h00m10s000ms (2) START\n" +
                     "+1h00m10s000ms (2) TIME: 2024-05-02-10-00-10\n" +
                     "+1h00m10s000ms (2) *OVERFLOW*\n" +
                     "+1h10m00s000ms (2) TIME: 2024-05-02-10-10-00\n" +
                     "+1h10m01s000ms (2) 050 plug=ac\n",
             logged("10:05:00.000", on),
             "09:59:50 d1 p2 c0 t0, 10:05:00 d2 p1, 10:10:01 d1, 12:00:00 p0"},
            {"in a pause the log's first line looks back, but not for the plug of a full device",
             kReset + kComplete + "+1h00m10s000ms (2) 100 status=full +screen\n" +
                     "+1h30m00s000ms (2) TIME: 2024-05-02-10-30-00\n" +
                     "+1h30m01s000ms (2) 099 status=discharging plug=none\n",
             logged("10:10:00.000", "x: 1") + logged("10:20:00.000", on),
             "09:59:50 d1 p2 c0 t0, 10:00:10 d2, 10:10:00 d1, 10:20:00 d2, 10:30:01 p0, "
             "12:00:00 d1"},
    });
}

TEST_F(StateCourseTest, ReadsSectionsFromWhereTheyBeginToWhereTheyEnd) {
    const std::string text = bugReport("0 (1) RESET:TIME: 2024-05-02-11-00-00\n" + kComplete, "");
    const std::string states = "11:00:00 d1 p2 c0 t0, 12:00:00 p0";
    const std::string on = "+1h00m00s000ms (2) 050 +screen\n";
    const std::string heading = "Battery History (1):\n" + kReset + on + "\n";
    const std::string log = "------ EVENT LOG (x) ------\n";
    for (const auto& [before, inserted] : std::vector<std::pair<std::string, std::string>>{
                 {"DUMP OF SERVICE b", "DUMP OF SERVICE other:\n" + heading},
                 {"DUMP OF SERVICE b", "DUMP OF SERVICE batterystats2:\n" + heading},
                 {"DUMP OF SERVICE b", " " + heading + "x " + heading},
                 {"DUMP OF SERVICE CRITICAL", on},
                 {"DUMP OF SERVICE b", logged("10:00:00.000", "screen_toggled: 1")},
                 {"DUMP OF SERVICE b", "------ EVENT LOG TAGS (x) ------\n" +
                                               logged("10:00:00.000", "screen_toggled: 1")},
                 {"", "== dumpstate: 2024-05-01 11:59:00\n"},
                 {"end", "== dumpstate: 2024-05-03 11:59:00\n" + log +
                                 logged("10:00:00.000", "screen_toggled: 1") +
                                 "------\nDUMP OF SERVICE batterystats:\n" + heading +
                                 "DUMP OF SERVICE sensorservice:\n--------- 0.1s was the duration "
                                 "of dumpsys sensorservice, ending at: 2024-05-02 13:00:00\n"}}) {
        std::string changed = text;
        changed.insert(before == "end" ? text.size() : text.find(before), inserted);
        EXPECT_EQ(statesOf(importText(changed).trace), states) << inserted;
    }
}

TEST_F(StateCourseTest, SaysWhatCannotBeDated) {
    const auto warnings = [](std::string text, const char* without) {
        while (*without != '\0' && text.find(without) != std::string::npos) {
            text.erase(text.find(without), std::string(without).size());
        }
        const auto imported = importText(text);
        return statesOf(imported.trace) + (imported.warnings.empty() ? "" : imported.warnings[0]);
    };
    const std::string course = kReset + kComplete;
    EXPECT_EQ(warnings(bugReport("0 (2) 050 +screen\n", ""), ""),
              "capture:5: warning: the battery history is left out: it has no TIME line");
    EXPECT_EQ(warnings(bugReport(course, ""), ""), "09:59:50 d1 p2 c0 t0, 12:00:00 p0");
    EXPECT_EQ(warnings(bugReport("", ""), ""), "");
    // The header alone tells when knowledge ends; nothing does without it.
    EXPECT_EQ(warnings(bugReport(course, ""), ", ending at: 2024-05-02 12:00:00"),
              "09:59:50 d1 p2 c0 t0, 11:59:00 p0");
    std::string undated = bugReport(course, "");
    undated.erase(undated.find(", ending at"), 32);
    EXPECT_EQ(warnings(undated, ": 2024-05-02 11:59:00"),
              "capture:5: warning: no display, charger, camera or calls: the capture does not say "
              "when it was taken");
    EXPECT_EQ(warnings(bugReport(course + "+59m59s000ms (2) SHUTDOWN\n+1h00m00s999ms (2) START\n"
                                          "+1h (2) TIME: 2024-05-02-10-00-01\n",
                                 ""),
                       ""),
              "09:59:50 d1 p2 c0 t0, 12:00:00 p0capture:9: warning: the system started or went "
              "down after the oldest registration (lines: 1)");
}

// What the description of the format prints of them.
TEST_F(StateCourseTest, AgreesWithTheExamplesOfRealReports) {
    const std::filesystem::path folder = SHARED_CAPTURES;
    if (!std::filesystem::exists(folder)) GTEST_SKIP() << "no real captures at " << folder;
    for (const auto& [file, states] : std::vector<std::pair<std::string, std::string>>{
                 {"android-8.1-phone",
                  "11:42:11 d2 p2 c0 t0, 11:42:15 d1, 11:42:17 d2, 11:42:34 d1, 11:42:54 d2, "
                  "11:45:34 d1 p0"},
                 {"android-7.1-phone",
                  "+1 15:58:29 d2 p2, +1 16:03:32 d1, +1 16:36:14 d2, +1 16:41:19 d1, +1 16:43:36 "
                  "d2, +1 16:48:41 d1, +1 17:12:53 d2, +1 17:23:49 d1, +1 17:54:52 d2, +1 "
                  "18:02:42 d1, +1 18:37:43 c0 t0, +1 18:37:45 d2, +1 18:42:50 d1, +1 20:50:49 "
                  "p0"},
                 {"android-9-board", "07:36:50 d1 p1 c0 t0, 07:36:59 d2, 08:05:43 d1 p0"}}) {
        std::ostringstream text;
        text << std::ifstream(folder / (file + "-report.txt")).rdbuf();
        EXPECT_EQ(statesOf(importText(text.str()).trace), states) << file;
    }
}

}  // namespace
