#include <algorithm>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "tests/Captures.h"
#include "tests/ReplayTool.h"

namespace {

using Lines = std::vector<std::string>;

const std::string kHeading = "Previous Registrations:\n";

class CaptureImportTest : public ReplayToolTest {
protected:
    /** The registrations of the trace of a capture with these newest-first registration lines. */
    static Lines registrations(const std::string& lines) {
        return callsWith("enableSuccess", importText(kSensors + kHeading + lines).trace);
    }

    /** A reader of the trace sees what the file says of its capture, if there is one. */
    static void checkUses(const std::string& trace, const std::filesystem::path& file) {
        if (!std::filesystem::exists(file)) return;
        std::ostringstream text;
        text << std::ifstream(file).rdbuf();
        Lines expected = linesWith("", text.str());
        Lines uses = usesOf(trace);
        std::sort(expected.begin(), expected.end());
        std::sort(uses.begin(), uses.end());
        EXPECT_EQ(uses, expected) << file;
    }

    static std::string enable(long long at, const std::string& arguments) {
        return "{\"at\": " + std::to_string(at) +
               ", \"call\": \"SDCImpl.enableSuccess\", \"args\": [" + arguments + "]}";
    }

    /** Lines that turn a sensor off, newest first, at these times. */
    static std::string offs(const Lines& times) {
        std::string lines;
        for (const std::string& time : times) {
            lines += time + " - 0x00000000 pid=1 uid=1 package=a\n";
        }
        return lines;
    }
};

TEST_F(CaptureImportTest, ReadsTheRegistrationsOfEveryPlatformVersion) {
    const Lines expected{enable(3'723'000, R"(true, 1, "a.b$C", "a.b$C", 20000000)"),
                         enable(3'724'000, R"(false, 1, "a.b$C", "a.b$C", 0)")};
    for (const char* capture :
         {"01:02:04 de-activated package=a.b$C handle=0x00000000\n"
          "01:02:03 activated package=a.b$C handle=0x00000000 samplingRate=20000us "
          "maxReportLatency=0us\n",
          "01:02:04 de-activated handle=0x00000000 package=a.b$C\n"
          "01:02:03 activated handle=0x00000000 samplingRate=20000us maxReportLatency=0us "
          "package=a.b$C\n",
          "01:02:04 - 0x00000000 pid=  519 uid=10012 package=a.b$C\n"
          "01:02:03 + 0x00000000 pid=  519 uid=10012 package=a.b$C samplingPeriod=20000us "
          "batchingPeriod=0us\n",
          "01:02:04 - 0x00000000 pid=  519 uid=10012 samplingPeriod=     N/A  us "
          "batchingPeriod=     N/A  us result=OK (sensor, package): (Zero, one,          , a.b$C)\n"
          "01:02:03 + 0x00000000 pid=  519 uid=10012 samplingPeriod=   20000us "
          "batchingPeriod=       0us result=OK (sensor, package): (Zero                  , "
          "a.b$C)\n"}) {
        EXPECT_EQ(registrations(capture), expected) << capture;
    }
    EXPECT_EQ(registrations("01:02:03 + 0x5f636779 pid=  519 uid= 1000 package=a b "
                            "samplingPeriod=9999999us batchingPeriod=0us\n"),
              (Lines{enable(3'723'000, R"(true, 65537, "a b", "android", 9999999000)")}));
}

TEST_F(CaptureImportTest, FindsItsSectionInABugReportThatPassedThroughAChat) {
    const std::string other =
            "DUMP OF SERVICE display:\n"
            "0x00000000) Other | Maker | ver: 1 | type: x(99) | perm: n/a\n"
            "Previous Registrations:\n"
            "09:00:00 + 0x00000000 pid=1 uid=1 package=no samplingPeriod=1us batchingPeriod=0us\n";
    std::string report =
            "== dumpstate: 2024-01-01 00:00:00\n" + other +
            "DUMP OF SERVICE CRITICAL sensorservice:\n" + kSensors + "Maker's own line\n" +
            "Previous Registrations:\n"
            "08:00:00 - 0x00000000 pid=1 uid=1 package=yes\n"
            "Maker's own line\n"
            "07:00:00 + 0x00000000 pid=1 uid=1 package=yes samplingPeriod=1us batchingPeriod=0us\n"
            "Maker's own heading:\n"
            "06:00:00 - 0x00000000 pid=1 uid=1 package=no\n"
            "--------- 0.003s was the duration of dumpsys sensorservice, ending at: now\n" +
            other;
    std::string quoted = "\xEF\xBB\xBF";
    for (const char c : report) {
        if (quoted.back() == '\n' || quoted.size() == 3) quoted += "> > ";
        quoted += c == '\n' ? "\r\n" : std::string(1, c);
    }
    const Lines expected{enable(25'200'000, R"(true, 1, "yes", "yes", 1000)"),
                         enable(28'800'000, R"(false, 1, "yes", "yes", 0)")};
    for (const std::string& text : {report, quoted}) {
        const auto imported = importText(text);
        EXPECT_EQ(callsWith("enableSuccess", imported.trace), expected);
        ASSERT_EQ(imported.warnings.size(), 1u);
        EXPECT_EQ(imported.warnings[0],
                  "capture:17: warning: 1 registrations left out: they stand behind the end of "
                  "their section, the first is \"06:00:00 - 0x00000000 pid=1 uid=1 package=no\"");
    }
}

TEST_F(CaptureImportTest, MakesTheCallsOfTheHostAroundTheRegistrations) {
    const auto imported = importText(
            kSensors + kHeading +
            "00:00:00 - 0x00000000 pid=1 uid=1 package=a\n"
            "22:59:59 + 0x00000000 pid=1 uid=1 package=a samplingPeriod=1us batchingPeriod=0us\n");
    const Lines calls = callsWith("", imported.trace);
    const auto call = [](const char* at, const std::string& name, const char* argument) {
        return std::string("{\"at\": ") + at + ", \"call\": \"" + name + "\"" +
               (*argument != '\0' ? std::string(", \"args\": [") + argument + "]" : "") + "}";
    };
    ASSERT_EQ(calls.size(), 4 + 2 + 24 * 6 + 6 + 1u);
    EXPECT_EQ(Lines(calls.begin(), calls.begin() + 12),
              (Lines{call("82789000", "SDCImpl.getInstance", ""),
                     call("82789000", "FlowingDataException.notifyBootCompleted", ""),
                     call("82789000", "SDCImpl.sendBootShutdownRebootState", "1"),
                     call("82789000", "SDCImpl.sendUsedTime", "1"),
                     enable(82'799'000, R"(true, 1, "a", "a", 1000)"),
                     call("82800000", "SDCImpl.notifySdcClock", "23"),
                     call("82800000", "SDCImpl.putRgbShotTally", "23"),
                     call("82800000", "SDCImpl.putPhoneOpenUltraTally", "23"),
                     call("82810000", "SDCImpl.notifySdcReset", "23"),
                     call("82810000", "SDCImpl.notifyRgbShotReset", "23"),
                     call("82810000", "SDCImpl.notifyUltraReset", "23"),
                     call("86400000", "SDCImpl.sendUsedTime", "2")}));
    EXPECT_EQ(calls[15], enable(86'400'000, R"(false, 1, "a", "a", 0)"));
    EXPECT_EQ(linesWith("", imported.trace).back(), R"({"at": 169220000})");
}

TEST_F(CaptureImportTest, BeginsAndEndsADayByItsEdges) {
    struct Edge {
        const char* time;
        Lines firstAndLast;  // of the start, of the reports, of all
    };
    for (const auto& [time, expected] :
         std::vector<Edge>{{"10:00:10", {"36000000", "39600000", "82800000", "82820000"}},
                           {"10:00:09", {"35999000", "36000000", "82800000", "82820000"}},
                           {"00:00:09", {"0", "3600000", "82800000", "82820000"}},
                           {"23:00:20", {"82810000", "none", "none", "82820000"}},
                           {"23:00:21", {"82811000", "86400000", "169200000", "169220000"}}}) {
        const std::string trace = importText(kSensors + kHeading + offs({time})).trace;
        const auto timeOf = [](const std::string& line) {
            return line.substr(7, line.find_first_of(",}") - 7);
        };
        Lines ticks = linesWith("notifySdcClock", trace);
        if (ticks.empty()) ticks = {"{\"at\": none,"};
        const Lines all = linesWith("", trace);
        EXPECT_EQ((Lines{timeOf(all.front()), timeOf(ticks.front()), timeOf(ticks.back()),
                         timeOf(all.back())}),
                  expected)
                << time;
    }
}

TEST_F(CaptureImportTest, PassesMidnightsAndWarnsOfAClockThatWasSetBack) {
    struct Course {
        Lines printed;  // oldest first
        Lines times;
        size_t setBack;
    };
    for (const auto& [printed, times, setBack] : std::vector<Course>{
                 {{"21:00:00", "09:30:00"}, {"75600", "120600"}, 0},
                 {{"12:00:00", "11:00:00"}, {"43200", "43200"}, 1},
                 {{"12:00:00", "10:59:59"}, {"43200", "125999"}, 0},
                 {{"23:59:59", "00:00:00", "23:59:59", "00:00:00"},
                  {"86399", "86400", "172799", "172800"},
                  0},
                 // Lines are compared as they are printed: no fall here is more than an hour.
                 {{"12:00:00", "11:20:00", "10:40:00", "11:59:59", "12:00:01"},
                  {"43200", "43200", "43200", "43200", "43201"},
                  3},
                 {{"12:00:00", "11:30:00", "00:10:00"}, {"43200", "43200", "87000"}, 1}}) {
        const auto imported =
                importText(kSensors + kHeading + offs(Lines(printed.rbegin(), printed.rend())));
        Lines expected;
        for (const std::string& time : times) {
            expected.push_back(enable(std::stoll(time) * 1000, R"(false, 1, "a", "a", 0)"));
        }
        EXPECT_EQ(callsWith("enableSuccess", imported.trace), expected) << printed[1];
        EXPECT_EQ(imported.warnings.size(), setBack) << printed[1];
    }
    EXPECT_EQ(importText(kSensors + kHeading + offs({"11:30:00", "12:00:00"})).warnings,
              Lines{"capture:6: warning: the clock was set back; the time of the line before it "
                    "stands"});
}

TEST_F(CaptureImportTest, LosesNoRegistrationWithoutAWord) {
    const std::string good = offs({"01:00:00"});
    const std::string left = " registrations left out: ";
    const std::string unreadable = left + "they cannot be read, the first is ";
    const std::string behind = left + "they stand behind the end of their section, the first is ";
    struct Capture {
        std::string lines;
        size_t kept;
        Lines warnings;
    };
    for (const auto& [lines, kept, warnings] : std::vector<Capture>{
                 {"02:00:00 + 0xzz pid=1 uid=1 package=b samplingPeriod=1us\n02:00:00 +\n"
                  "02:00:00 flushed\n25:00:00 + 0x0\n01:30:00 de-activated handle=0x1\n"
                  "1:02:03 - 0x0 package=a\n12:00:00.123 activated handle=0x0\n12:00 - 0x0\n"
                  "99:99:99 -\n02:00:00 - 0x0 pid=1 uid=5000000000 package=a\n" +
                          good,
                  1,
                  {"6: warning: 8" + unreadable +
                   "\"02:00:00 + 0xzz pid=1 uid=1 package=b samplingPeriod=1us\""}},
                 {good + "Maker's statistics:\n" + good + "text\n" + good,
                  1,
                  {"8: warning: 2" + behind + "\"01:00:00 - 0x00000000 pid=1 uid=1 package=a\""}},
                 {good + "\n" + good + "\n\n" + good + "\nMaker's text\n" + good,
                  3,
                  {"14: warning: 1" + behind + "\"01:00:00 - 0x00000000 pid=1 uid=1 package=a\""}},
                 {good + "-----\n" + offs({"02:00:00"}) +
                          "--------- 0.003s was the duration of dumpsys sensorservice\n" + good,
                  1,
                  {"8: warning: 1" + behind + "\"02:00:00 - 0x00000000 pid=1 uid=1 package=a\""}},
                 {"02:00:00 - 0x00000077 pid=1 uid=1 package=b\n" + good,
                  1,
                  {"6: warning: 1" + left + "their sensors are not in the list"}},
                 {std::string("02:00:00 - 0x00000000 pid=1 uid=1 package=b\0\n", 45) + good,
                  1,
                  {"6: warning: 1" + unreadable +
                   "\"02:00:00 - 0x00000000 pid=1 uid=1 package=b\\u0000\""}}}) {
        const auto imported = importText(kSensors + kHeading + lines);
        EXPECT_EQ(callsWith("enableSuccess", imported.trace).size(), kept) << lines;
        Lines expected;
        for (const std::string& warning : warnings) expected.push_back("capture:" + warning);
        EXPECT_EQ(imported.warnings, expected) << lines;
    }
}

TEST_F(CaptureImportTest, LosesNothingOfItsTablesWithoutAWord) {
    const std::string client = " | WakeLockRefCount 0 | uid ";
    const std::string left = " left out: they cannot be read, the first is ";
    const std::string longName(65536, 'x');
    const std::string odd = "\x01<b>\xff | WakeLockRefCount 1 | uid 3 | \"";
    struct Table {
        std::string text;
        Lines warnings;
    };
    for (const auto& [table, warnings] : std::vector<Table>{
                 {"2 active connections\n" + longName + client + "1 | x\n" + odd + client + "7\n",
                  {}},
                 {"1 active connections\n" + longName + client + "5000000000 | x\n",
                  {"6: warning: 1 lines of connections" + left + '"' + longName.substr(0, 200) +
                   "\"..."}},
                 {"1 open event connections\na" + client + "1\nX 0x123456789 | status: active\n",
                  {"7: warning: 1 lines of connections" + left +
                   "\"X 0x123456789 | status: active\""}},
                 {"3 active connections\na" + client + "1\n",
                  {"5: warning: not all connections are there: 1 of 3"}},
                 {"1 direct connections\nPackage " + longName.substr(0, 9) +
                          ", HAL channel handle 1, total sensor activated 99999999999999999999\n",
                  {"6: warning: 1 lines of direct connections" + left + '"' +
                   longName.substr(0, 9) +
                   ", HAL channel handle 1, total sensor activated 99999999999999999999\""}},
                 {"------ CHECKIN BATTERYSTATS (x) ------\n9,0,i,uid,10018," + longName +
                          "\n9,10018,l,sr,12,1,2\n9,10018,l,sr,5000000000,1,2\n"
                          "9,10018,l,sr,12,1,2,3,99999999999999999999,5\n9,5000000000,l,sr,1,1,2\n"
                          "9,10018,l,sr,12,1,2,3,4\n"
                          "9,0,l,xy,z\n9,0,i,uid,x,a\n------ 0.1s was it ------\n",
                  {"8: warning: 5 lines of the battery statistics" + left +
                   "\"9,10018,l,sr,5000000000,1,2\""}}}) {
        const auto imported = importText(kSensors + table + kHeading + offs({"01:00:00"}));
        Lines expected;
        for (const std::string& warning : warnings) expected.push_back("capture:" + warning);
        EXPECT_EQ(imported.warnings, expected) << table.substr(0, 100);
        EXPECT_EQ(callsWith("enableSuccess", imported.trace).size(), 1u);
    }
    const std::string odds =
            importText(kSensors + "1 active connections\n" + odd + client +
                       "7\nZ 0x00000000 | status: active\n" + kHeading + offs({"01:00:00"}))
                    .trace;
    EXPECT_EQ(usesOf(odds).back(),
              R"({"use": {"pkg": "\u0001<b>\ufffd | WakeLockRefCount 1 | uid 3 | \"", "uid": 7, )"
              R"("handle": 0, "from": 3590000, "before": true, "enables": 1, "periodUs": 200000, )"
              R"("to": 3600000, "end": "on"}})");
}

TEST_F(CaptureImportTest, NotesWhatWasRefusedOnce) {
    const auto line = [](const std::string& time, const char* sign, const std::string& result) {
        return time + ' ' + sign +
               " 0x00000000 pid=    9 uid=    1 samplingPeriod=     N/A  us batchingPeriod=     "
               "N/A  us result=" +
               result + " (sensor, package): (Zero                  , a)\n";
    };
    const std::string no = "-22 (Invalid argument)";
    const std::string older = line("02:00:01", "+", no) + line("02:00:01", "+", no) +
                              line("02:00:00", "-", no) + line("01:30:00", "-", "BAD_VALUE") +
                              line("01:00:00", "-", "OK");
    const std::string newer = line("02:10:00", "-", "OK") + line("02:00:01", "+", no) +
                              line("02:00:00", "-", no) + line("00:59:59", "+", "FAILED");
    const auto imported = importTexts({kSensors + kHeading + older, kSensors + kHeading + newer});
    EXPECT_EQ(imported.warnings, Lines{});
    EXPECT_EQ(callsWith("enableSuccess", imported.trace),
              (Lines{enable(3'600'000, R"(false, 1, "a", "a", 0)"),
                     enable(7'200'000, R"(false, 1, "a", "a", 0)"),
                     enable(7'800'000, R"(false, 1, "a", "a", 0)")}));
    const trace::Note note = noteWith("\"taken\"", imported.trace);
    ASSERT_TRUE(note.taken);
    ASSERT_EQ(note.taken->refused.size(), 2u);
    EXPECT_EQ(note.taken->refused[0].result, "FAILED");
    EXPECT_EQ(note.taken->refused[1].result, no);
    EXPECT_EQ(note.taken->refused[1].count, 2);
    EXPECT_EQ(importText(kSensors + kHeading + line("02:00:00", "+", no)).error,
              "capture: no previous registrations that were not refused");
}

TEST_F(CaptureImportTest, SaysIfMergedCapturesDiffer) {
    const std::string list = kHeading + offs({"01:00:00"});
    const std::string version = "------ CHECKIN BATTERYSTATS (x) ------\n9,0,i,vers,27,167,";
    std::string other = kSensors;
    other.replace(other.find("Zero"), 4, "Null");
    const std::string ask = " than in 0: are they captures of one device?";
    EXPECT_EQ(importTexts({kSensors + list + version + "A\n", other + list,
                           kSensors + list + version + "B\n", kSensors + list})
                      .warnings,
              (Lines{"1:1: warning: other sensors" + ask,
                     "2:1: warning: another build of the system" + ask}));
}

TEST_F(CaptureImportTest, ReadsACaptureInWhichEveryLineIsFollowedByAnEmptyOne) {
    std::string doubled;
    for (const char c : kSensors + kHeading + offs({"02:00:00", "01:00:00"}) + "Text\n") {
        doubled += c == '\n' ? "\r\n\r\n" : std::string(1, c);
    }
    const auto imported = importText(doubled);
    EXPECT_EQ(callsWith("enableSuccess", imported.trace).size(), 2u);
    EXPECT_EQ(imported.warnings, Lines{});
}

TEST_F(CaptureImportTest, TakesTheFirstOfSeveralDumpsThatHasRegistrations) {
    const std::string service = "DUMP OF SERVICE sensorservice:\n";
    const std::string none = "No Sensors on the device\n";
    const std::string dump = kSensors + kHeading + offs({"01:00:00"});
    for (const std::string& text :
         {service + none + service + dump, none + dump,
          service + "0000000000) X | M | ver: 1 | type: x(7) | perm: n/a\n" + service + dump,
          "DUMP OF SERVICE x:\n\xEF\xBB\xBF" + service + dump, ">   DUMP OF SERVICE x:\n" + dump,
          "== dumpstate: 2024-01-01 00:00:00\n" + service + none +
                  "== dumpstate: 2024-02-01 02:00:00\n" + service + dump}) {
        const auto imported = importText(text);
        EXPECT_EQ(imported.error, "");
        EXPECT_EQ(callsWith("enableSuccess", imported.trace),
                  Lines{enable(3'600'000, R"(false, 1, "a", "a", 0)")})
                << text;
    }
    const auto twice = importText(service + dump + service + dump);
    EXPECT_EQ(callsWith("enableSuccess", twice.trace).size(), 1u);
    EXPECT_EQ(twice.warnings.size(), 1u);
}

TEST_F(CaptureImportTest, SaysWhatIsMissing) {
    const std::string one = kHeading + offs({"01:00:00"});
    for (const auto& [text, error] : std::vector<std::pair<std::string, std::string>>{
                 {"DUMP OF SERVICE sensorservice:\nNo Sensors on the device\n",
                  "capture: no sensors on the device, so no registrations"},
                 {kSensors, "capture: no previous registrations"},
                 {kSensors + kHeading + "\n", "capture: no previous registrations"},
                 {kSensors + kHeading + "maker\n1 on \"a\"\n",
                  "capture: no previous registrations that can be read: 2 lines of an unknown "
                  "form, the first is \"maker\""},
                 {kSensors + kHeading + "maker\n01:00:00 + x\n",
                  "capture: no previous registrations that can be read: 1 lines of an unknown "
                  "form, the first is \"01:00:00 + x\""},
                 {"== dumpstate: x\nDUMP OF SERVICE display:\n" + kSensors + one,
                  "capture: no sensor service in the bug report"},
                 {"hello\n", "capture:1: neither a JSON object nor part of a device capture"}}) {
        EXPECT_EQ(importText(text).error, error);
    }
    write("capture", "\n# x\nhello\n");
    const Played played = run("--print-trace capture");
    EXPECT_EQ(played.err, "capture:3: neither a JSON object nor part of a device capture\n");
    EXPECT_EQ(played.status, 2);
    EXPECT_EQ(played.out, "");
}

TEST_F(CaptureImportTest, DescribesWhereTheTraceComesFrom) {
    const std::string line = "0x00000001) One | M | ver: 1 | type: t(1) | perm: n/a\n";
    std::string text = bugReport("0 (1) RESET:TIME: 2024-05-02-11-00-00\n0 (2) 050 +screen\n",
                                 "05-02 09:30:00.000  1  2 I screen_toggled: 1\n");
    text.replace(text.find(kHeading), 0, line);
    const trace::Note note = noteWith("\"capture\"", importText(text).trace);
    ASSERT_TRUE(note.capture && note.sensors && note.known);
    EXPECT_EQ(note.capture->files, Lines{"capture"});
    EXPECT_EQ(note.capture->taken, "2024-05-02 12:00:00");
    EXPECT_EQ(note.capture->midnight, "2024-05-02");
    EXPECT_EQ(note.capture->from, 36'000'000);
    EXPECT_EQ(note.capture->registrations, 1);
    EXPECT_EQ(note.capture->knownTo, 43'200'000);
    ASSERT_EQ(note.sensors->size(), 3u);
    EXPECT_EQ((*note.sensors)[0].mode, trace::SensorMode::kContinuous);
    EXPECT_EQ((*note.sensors)[0].minRate, 1.0F);
    EXPECT_EQ((*note.sensors)[1].name, "Name (with) brackets");
    ASSERT_EQ(note.known->display.size(), 1u);
    EXPECT_EQ(note.known->display[0].from, 35'990'000);
    EXPECT_EQ(note.known->display[0].to, 43'200'000);
    ASSERT_EQ(note.known->camera.size(), 1u);
    EXPECT_EQ(note.known->camera[0].from, 39'600'000);
    EXPECT_TRUE(note.known->charge.empty());
    const std::string undated = importText(kSensors + kHeading + offs({"01:00:00"})).trace;
    EXPECT_FALSE(noteWith("\"capture\"", undated).capture->midnight);
}

TEST_F(CaptureImportTest, PlaysEveryRealCaptureAndTheTraceMadeOfItAlike) {
    const std::filesystem::path folder = SHARED_CAPTURES;
    if (!std::filesystem::exists(folder)) GTEST_SKIP() << "no real captures at " << folder;
    int played = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        if (!entry.is_regular_file()) continue;
        const std::string file = "'" + entry.path().string() + "'";
        const Played direct = run("--json " + file);
        if (entry.path().filename() == "android-9-no-sensors.txt") {
            EXPECT_EQ(direct.status, 2);
            EXPECT_NE(direct.err.find("no sensors on the device"), std::string::npos);
            continue;
        }
        EXPECT_EQ(direct.status, 0) << direct.err;
        const std::string trace = run("--print-trace " + file).out;
        write("trace", trace);
        checkUses(trace, folder / "expected" / entry.path().filename().replace_extension("jsonl"));
        EXPECT_EQ(run("--json trace").out, direct.out) << file;
        ++played;
        if (entry.path().filename() == "android-9-emulator.txt") {
            const Lines reports = linesWith("N273|10003", direct.out);
            ASSERT_EQ(reports.size(), 2u);
            EXPECT_EQ(reports[0].find(R"({"at": 82800000, )"), 0u);
            EXPECT_EQ(reports[1].find(R"({"at": 169200000, )"), 0u);
            for (const std::string& report : reports) {
                EXPECT_NE(report.find("aydp/aydp"), std::string::npos);
            }
        }
    }
    EXPECT_GT(played, 0);
}

}  // namespace
