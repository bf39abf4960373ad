#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "tests/ReplayTool.h"

namespace {

using Lines = std::vector<std::string>;

const std::string kSensors =
        "Sensor List:\n"
        "0000000000) Zero | Maker | ver: 1 | type: android.sensor.accelerometer(1) | perm: n/a\n"
        "\tcontinuous | minRate=1.00Hz\n"
        "0x5f636779) Name (with) brackets | Maker | ver: 1 | type: com.maker.magic(65537) | perm: "
        "n/a | flags: 0x00000000\n";

/** An import's traces, as lines. */
class CaptureImportTest : public ReplayToolTest {
protected:
    Played import(const std::string& capture) const {
        write("capture", capture);
        return run("--print-trace capture");
    }

    /** The registrations of the trace of a capture with these newest-first registration lines. */
    Lines registrations(const std::string& lines) const {
        return select(import(kSensors + "Previous Registrations:\n" + lines).out, "enableSuccess");
    }

    static Lines select(const std::string& text, const std::string& part) {
        Lines lines;
        std::istringstream stream(text);
        for (std::string line; std::getline(stream, line);) {
            if (line.find(part) != std::string::npos) lines.push_back(line);
        }
        return lines;
    }

    static std::string enable(long long at, const std::string& arguments) {
        return "{\"at\": " + std::to_string(at) +
               ", \"call\": \"SDCImpl.enableSuccess\", \"args\": [" + arguments + "]}";
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
    EXPECT_EQ(select(import(report).out, "enableSuccess"), expected);
    EXPECT_EQ(select(import(quoted).out, "enableSuccess"), expected);
}

TEST_F(CaptureImportTest, MakesTheCallsOfTheHostAroundTheRegistrations) {
    const Played played = import(
            kSensors +
            "Previous Registrations:\n"
            "00:00:00 - 0x00000000 pid=1 uid=1 package=a\n"
            "22:59:59 + 0x00000000 pid=1 uid=1 package=a samplingPeriod=1us batchingPeriod=0us\n");
    Lines calls = select(played.out, "");
    const auto call = [](const char* at, const std::string& name, const char* argument) {
        return std::string("{\"at\": ") + at + ", \"call\": \"" + name + "\"" +
               (*argument != '\0' ? std::string(", \"args\": [") + argument + "]" : "") + "}";
    };
    ASSERT_EQ(calls.size(), 4 + 2 + 24 * 6 + 6 + 1 + 1u);
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
    EXPECT_EQ(calls.back(), R"({"at": 169220000})");
}

TEST_F(CaptureImportTest, PassesMidnightsAndWarnsOfAClockThatWasSetBack) {
    const Played played = import(kSensors +
                                 "Previous Registrations:\n"
                                 "11:00:00 - 0x00000000 pid=1 uid=1 package=d\n"
                                 "12:00:00 - 0x00000000 pid=1 uid=1 package=c\n"
                                 "00:00:09 - 0x00000077 pid=1 uid=1 package=unknown\n"
                                 "12:00:10 - 0x00000000 pid=1 uid=1 package=b\n"
                                 "00:00:05 - 0x00000078 pid=1 uid=1 package=unknown\n"
                                 "00:00:05 - 0x00000000 pid=1 uid=1 package=a\n");
    EXPECT_EQ(select(played.out, "enableSuccess"),
              (Lines{enable(5'000, R"(false, 1, "a", "a", 0)"),
                     enable(43'210'000, R"(false, 1, "b", "b", 0)"),
                     enable(129'600'000, R"(false, 1, "c", "c", 0)"),
                     enable(129'600'000, R"(false, 1, "d", "d", 0)")}));
    EXPECT_EQ(select(played.out, "getInstance"),
              (Lines{R"({"at": 0, "call": "SDCImpl.getInstance"})"}));
    EXPECT_EQ(select(played.err, ""),
              (Lines{"capture:6: warning: the clock was set back; the time of the line before it "
                     "stands",
                     "capture:10: warning: 2 registrations left out: their sensors are not in the "
                     "list"}));
    EXPECT_EQ(played.status, 0);
}

TEST_F(CaptureImportTest, SaysWhatIsMissing) {
    const std::string one =
            "Previous Registrations:\n01:00:00 - 0x00000000 pid=1 uid=1 package=a\n";
    for (const auto& [capture, error] : std::vector<std::pair<std::string, std::string>>{
                 {"DUMP OF SERVICE sensorservice:\nNo Sensors on the device\n",
                  "capture: no sensors on the device, so no registrations\n"},
                 {kSensors, "capture: no previous registrations\n"},
                 {kSensors + "Previous Registrations:\n\n", "capture: no previous registrations\n"},
                 {"== dumpstate: x\nDUMP OF SERVICE display:\n" + kSensors + one,
                  "capture: no sensor service in the bug report\n"},
                 {"\n# x\nhello\n",
                  "capture:3: neither a JSON object nor part of a device capture\n"}}) {
        const Played played = import(capture);
        EXPECT_EQ(played.err, error);
        EXPECT_EQ(played.status, 2);
        EXPECT_EQ(played.out, "");
    }
}

TEST_F(CaptureImportTest, PlaysEveryRealCaptureAndTheTraceMadeOfItAlike) {
    const std::filesystem::path folder = SHARED_CAPTURES;
    if (!std::filesystem::exists(folder)) GTEST_SKIP() << "no real captures at " << folder;
    int played = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        const std::string file = "'" + entry.path().string() + "'";
        const Played direct = run("--json " + file);
        if (entry.path().filename() == "android-9-no-sensors.txt") {
            EXPECT_EQ(direct.status, 2);
            EXPECT_NE(direct.err.find("no sensors on the device"), std::string::npos);
            continue;
        }
        EXPECT_EQ(direct.status, 0) << direct.err;
        write("trace", run("--print-trace " + file).out);
        EXPECT_EQ(run("--json trace").out, direct.out) << file;
        ++played;
        if (entry.path().filename() == "android-9-emulator.txt") {
            const Lines reports = select(direct.out, "N273|10003");
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
