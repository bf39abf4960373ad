#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "tests/Captures.h"

namespace {

const std::string kList =
        "Sensor List:\n"
        "0000000000) Zero | Maker | ver: 1 | type: a(1) | perm: n/a\n\tcontinuous | non-wakeUp |\n"
        "0x00000001) Shot | Maker | ver: 1 | type: b(8) | perm: n/a\n\ton-change | wakeUp |\n"
        "0x00000002) Shot | Maker | ver: 1 | type: c(17) | perm: n/a\n\tone-shot | wakeUp |\n";

/** "10:00:00 +0 a@5 20000": time, on or off, handle, tag, uid (or none), period. Oldest first. */
std::string registrations(const std::string& lines) {
    std::string text;
    std::istringstream stream(lines);
    for (std::string line; std::getline(stream, line, ',');) {
        std::istringstream fields(line);
        std::string time;
        std::string action;
        std::string client;
        std::string period = "200000";
        fields >> time >> action >> client >> period;
        const size_t at = client.find('@');
        const bool on = action[0] == '+';
        const std::string tag = client.substr(0, at);
        const std::string handle = "0x0000000" + action.substr(1);
        std::string made = time;
        if (at == std::string::npos) {
            made += (on ? " activated handle=" + handle + " samplingRate=" + period +
                                     "us maxReportLatency=0us package="
                        : " de-activated handle=" + handle + " package=") +
                    tag;
        } else {
            made += ' ' + action.substr(0, 1) + ' ' + handle +
                    " pid= 9 uid=" + client.substr(at + 1) + " package=" + tag +
                    (on ? " samplingPeriod=" + period + "us batchingPeriod=0us" : "");
        }
        text.insert(0, made + '\n');
    }
    return "Previous Registrations:\n" + text;
}

/** "a@5 0 2, b@6": clients and the handles of their sensors. */
std::string connections(const std::string& clients) {
    std::string text;
    int count = 0;
    std::istringstream stream(clients);
    for (std::string client; std::getline(stream, client, ',');) {
        std::istringstream fields(client);
        std::string name;
        fields >> name;
        const size_t at = name.find('@');
        text += "Connection Number: " + std::to_string(count++) +
                "\n\tOperating Mode: NORMAL\n\t " + name.substr(0, at) +
                " | WakeLockRefCount 0 | uid " + name.substr(at + 1) +
                " | cache size 0 | max cache size 0\n";
        for (std::string handle; fields >> handle;) {
            text += "\t Some sensor 0x0000000" + handle +
                    " | status: active | pending flush events 0 \n";
        }
    }
    return std::to_string(count) + " active connections\n" + text + "0 direct connections\n";
}

std::string fired(const std::string& walls) {
    std::string text = "Recent Sensor events:\nShot: last 9 events\n";
    std::istringstream stream(walls);
    for (std::string wall; stream >> wall;) {
        // Seconds since midnight serve as seconds since the boot.
        const int seconds = std::stoi(wall.substr(0, 2)) * 3600 +
                            std::stoi(wall.substr(3, 2)) * 60 + std::stoi(wall.substr(6, 2));
        text += "\t 1 (ts=" + std::to_string(seconds) + wall.substr(8) + ", wall=" + wall + ") 1\n";
    }
    return text;
}

std::string requests(const std::string& periods) {
    return "Sensor Device:\nTotal 3 h/w sensors, 3 running:\n0x00000000) active-count = 1; "
           "sampling_period(ms) = {" +
           periods + "}, selected = 1.00 ms; batching_period(ms) = {0.0, 60.0}\n";
}

const std::string kFooter =
        "--------- 0.1s was the duration of dumpsys sensorservice, ending at: 2024-05-0";

struct UsesCase {
    const char* what;
    std::string before;  // the list of registrations
    std::string lines;
    std::string uses;
};

TEST(UseStepsTest, ShowsWhatNoLineTells) {
    const std::string nothing = connections("");
    for (const UsesCase& each : std::vector<UsesCase>{
                 {"a connection without a line", connections("a@5 0, c@7 9"),
                  "10:00:00 +1 b@6 0, 10:00:01 -1 b@6",
                  "b@6 1: 36000-36001 off x1 0us, <a@5 0: 35990-36001 on x1 200000us"},
                 {"an off without an on", nothing,
                  "10:00:00 -0 a@5, 10:00:02 +0 a@5 7, 10:00:03 -0 a@5",
                  "<a@5 0: 35990-36000 off x1 7us, a@5 0: 36002-36003 off x1 7us"},
                 {"two connections, of which one has a line", connections("a@5 0, a@5 0"),
                  "10:00:00 +0 a@5 7", "<a@5 0: 35990-36000 on x2 7us"},
                 {"an on that ended without an off, known by the connections", nothing,
                  "10:00:00 +0 a@5, 10:10:00 +0 a@5, 10:20:00 -0 a@5, 10:30:00 +0 a@5",
                  "a@5 0: 36000-36600 unseen x1 200000us, a@5 0: 36600-37200 off x1 200000us, "
                  "a@5 0: 37800-37800 unseen x1 200000us"},
                 {"the same without a table", "",
                  "10:00:00 +0 a@5, 10:10:00 +0 a@5, 10:20:00 -0 a@5, 10:30:00 +0 a@5",
                  "a@5 0: 36000-37800 on x3 200000us"},
                 {"a sensor that switched itself off", fired("10:05:00.500") + nothing,
                  "10:00:00 +2 a@5 1, 10:05:00 +2 b@5 1, 10:05:00 -2 a@5, 10:05:00 -2 b@5, "
                  "10:06:00 +1 a@5, 10:06:00 -1 a@5",
                  "a@5 2: 36000-36300 fired x1 1us, b@5 2: 36300-36300 fired x1 1us, "
                  "a@5 1: 36360-36360 off x1 200000us"},
                 {"a firing before a second's offs", fired("10:05:00.100") + nothing,
                  "10:05:00 -2 a@5, 10:05:00 +2 a@5 3, 10:05:00 +2 a@5 2, 10:05:00 -2 a@5",
                  "<a@5 2: 36290-36300 fired x1 3us, a@5 2: 36300-36300 unseen x1 3us, "
                  "a@5 2: 36300-36300 off x1 2us"},
                 {"two firings of a second", fired("10:05:00.100 10:05:00.900") + nothing,
                  "10:00:00 +2 a@5 1, 10:05:00 +2 a@5 2, 10:05:00 -2 a@5",
                  "a@5 2: 36000-36300 fired x1 1us, a@5 2: 36300-36300 fired x1 2us"},
                 {"the off of what fired comes after the next on", fired("10:05:00.100") + nothing,
                  "10:00:00 +1 b@6, 10:06:00 +2 a@5 3, 10:07:00 -2 a@5, 10:08:00 -2 a@5",
                  "<a@5 2: 35990-36300 fired x1 3us, a@5 2: 36360-36480 off x1 3us, "
                  "b@6 1: 36000-36480 unseen x1 200000us"},
                 {"firings before the start, and after the end, are passed over",
                  fired("09:59:49.9 10:06:00.0") + nothing, "10:00:00 -2 a@5",
                  "<a@5 2: 35990-36000 off x1 200000us"},
                 {"the system switches off what an app has on", nothing,
                  "10:00:00 +0 a@5, 10:00:01 +0 a@6, 10:00:02 -0 a@1000, 10:00:03 -0 a@1000, "
                  "10:00:04 -0 a@1000",
                  "a@6 0: 36001-36002 off x1 200000us, a@5 0: 36000-36003 off x1 200000us, "
                  "<a@1000 0: 35990-36004 off x1 200000us"},
                 {"it does so as often as the app has it on", nothing,
                  "10:00:00 +0 a@5, 10:00:01 +0 a@5, 10:00:02 -0 a@1000, 10:00:03 -0 a@1000",
                  "a@5 0: 36000-36003 off x2 200000us"},
                 {"what the system itself has on it switches off for itself", nothing,
                  "10:00:00 +0 a@1000, 10:00:01 +0 a@5, 10:00:02 -0 a@1000, 10:00:03 -0 a@5",
                  "a@1000 0: 36000-36002 off x1 200000us, a@5 0: 36001-36003 off x1 200000us"},
                 {"periods of what is on go to what has no line",
                  requests("66.7, 1.0, 20.0 (disabled), 200.0") +
                          connections("a@5 0, b@6 0, c@7 0"),
                  "10:00:00 +0 b@6 66667, 10:00:00 -1 d@5",
                  "<d@5 1: 35990-36000 off x1 200000us, <a@5 0: 35990-36000 on x1 1000us, "
                  "b@6 0: 36000-36000 on x1 66667us, <c@7 0: 35990-36000 on x1 200000us"},
                 {"more periods than connections say nothing",
                  requests("20.0, 1.0") + connections("a@5 0"), "10:00:00 -1 d@5",
                  "<d@5 1: 35990-36000 off x1 200000us, <a@5 0: 35990-36000 on x1 200000us"},
                 {"a line without a uid takes that of its tag", connections("a@5, a@5 0, b@6 1"),
                  "10:00:00 +0 a, 10:00:00 +1 b, 10:00:01 -1 b, 10:00:01 +2 c",
                  "c 2: 36001-36001 unseen x1 200000us, a@5 0: 36000-36001 on x1 200000us, "
                  "<b@6 1: 35990-36001 on x2 200000us"},
                 {"but not where they differ", connections("a@5 0, a@6 0, a@6 1"),
                  "10:00:00 +0 a, 10:00:00 -0 a, 10:00:01 +0 a",
                  "<a 0: 35990-36001 on x3 200000us, <a@6 1: 35990-36001 on x1 200000us"},
         }) {
        const auto imported = importText(kList + each.before + registrations(each.lines));
        EXPECT_EQ(imported.error, "") << each.what;
        EXPECT_EQ(shortUsesOf(imported.trace), each.uses) << each.what;
    }
}

/** A report of a day of May 2024 at noon. */
std::string dump(char day, const std::string& before, const std::string& lines) {
    return kList + before + registrations(lines) + kFooter + day + " 12:00:00\n";
}

TEST(UseStepsTest, FollowsEachPartBetweenGapsByItsNewestDump) {
    const auto merge = [](const std::string& first, const std::string& second) {
        return shortUsesOf(importTexts({dump('2', first, "10:00:00 +0 a@5 7, 10:00:01 +1 b@6"),
                                        dump('3', second, "10:30:00 +0 a@5 9, 10:31:00 -2 c@5")})
                                   .trace);
    };
    // Days after the first begin at 86400.
    const std::string on = connections("a@5 0, b@6 1");
    EXPECT_EQ(merge(on, connections("a@5 0, a@5 0, b@6 1, d@7 1")),
              "<c@5 2: 124200-124260 off x1 200000us, a@5 0: 36000-129600 on x2 7us, "
              "b@6 1: 36001-129600 on x1 200000us, <d@7 1: 124200-129600 on x1 200000us");
    EXPECT_EQ(merge(on, connections("a@5 0")),
              "a@5 0: 36000-124200 unseen x1 7us, b@6 1: 36001-124200 unseen x1 200000us, "
              "<c@5 2: 124200-124260 off x1 200000us, a@5 0: 124200-129600 on x1 9us");
    EXPECT_EQ(merge(connections("a@5 0, a@5 0"), ""),
              "b@6 1: 36001-124200 unseen x1 200000us, <c@5 2: 124200-124260 off x1 200000us, "
              "<a@5 0: 35990-129600 on x3 7us");
    EXPECT_EQ(merge("", fired("10:30:30.000")),
              "<c@5 2: 124200-124230 fired x1 200000us, a@5 0: 36000-129600 on x2 7us, "
              "b@6 1: 36001-129600 on x1 200000us");
}

TEST(UseStepsTest, KnowsUntilWhenItIsKnown) {
    struct End {
        const char* what;
        std::string text;
        int64_t knownTo;  // seconds
        const char* bound;
    };
    const auto at = [](const std::string& time) {
        return "Captured at: " + time + ".999\n" + kList + registrations("10:00:00 +0 a@5");
    };
    const std::string header = "== dumpstate: 2024-05-02 ";
    for (const End& each : std::vector<End>{
                 {"by the newest registration", kList + registrations("10:00:00 +0 a@5"), 36000,
                  "registration"},
                 {"by the footer, whatever else there is",
                  header + "11:59:00\n" + at("11:00:00") + kFooter + "2 12:00:00\n", 43200,
                  "stamp"},
                 {"a moment after the newest registration", at("10:00:00"), 36000, "capturedAt"},
                 {"a day later", at("08:59:59"), 118799, "capturedAt"},
                 {"the clock was set back", at("09:00:00"), 36000, "capturedAt"},
                 {"by the header", header + "11:00:00\n" + kList + registrations("10:00:00 +0 a@5"),
                  39600, "header"},
                 {"by an event",
                  header + "11:00:00\n" + kList + fired("09:00:00.000 12:00:00.700") +
                          registrations("10:00:00 +0 a@5"),
                  43200, "event"},
         }) {
        const auto capture = noteWith("\"capture\"", importText(each.text).trace).capture;
        ASSERT_TRUE(capture) << each.what;
        EXPECT_EQ(capture->knownTo, each.knownTo * 1000) << each.what;
        EXPECT_NE(importText(each.text).trace.find("\"bound\": \"" + std::string(each.bound)),
                  std::string::npos)
                << each.what;
    }
}

// After 23:00:20 the trace has ended, but uses go on.
TEST(UseStepsTest, TellsOfWhatHappensBehindTheTrace) {
    const std::string trace =
            importText(kList + fired("23:10:00.000") + connections("") +
                       registrations("22:00:00 +2 a@5, 22:00:00 +0 b@6, 22:00:01 +0 b@6") +
                       kFooter + "2 23:30:00\n")
                    .trace;
    EXPECT_EQ(shortUsesOf(trace),
              "b@6 0: 79200-79201 unseen x1 200000us, a@5 2: 79200-83400 fired x1 200000us, "
              "b@6 0: 79201-84600 unseen x1 200000us");
    EXPECT_EQ(linesWith("", trace).back(),
              "{\"at\": 82820000, \"note\": {\"taken\": {\"connections\": []}}}");
}

}  // namespace
