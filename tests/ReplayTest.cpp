#include <algorithm>
#include <string>
#include <utility>
#include <vector>

#include <cutils/properties.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include "platform/PropertyService.h"
#include "tests/ReplayTool.h"

namespace {

using Lines = std::vector<std::string>;

/** A line at a time, in milliseconds as the line has it. */
std::string line(const std::string& at, const std::string& rest) {
    return R"({"at": )" + at + ", " + rest + '}';
}

/** Lines, each with its line feed. */
std::string joined(const Lines& lines) {
    std::string text;
    for (const std::string& each : lines) text += each + '\n';
    return text;
}

// Lines of traces, and of the output: a boot, a sample that is counted, the count as it is stored,
// its report as it is asked for and as it is sent.

std::string boot(const std::string& at, const std::string& kind) {
    return line(at, R"("boot": ")" + kind + '"');
}

std::string sample(const std::string& at) {
    return line(at, R"("call": "SDCImpl.setRgbShotCount")");
}

std::string saved(const std::string& at, int count) {
    return line(at, R"("property": {"name": "persist.zuno.rgb.shot.count", "value": ")" +
                            std::to_string(count) + R"("})");
}

std::string report(const std::string& at) {
    return line(at, R"("call": "SDCImpl.putRgbShotTally", "args": [7])");
}

std::string reported(const std::string& at, int count) {
    const std::string number = std::to_string(count);
    return line(at, R"("event": {"module": "N273", "id": "N273|10009", "payload": "count:)" +
                            number + R"(", "fields": {"count": ")" + number + R"("}})");
}

/** A property that a file keeps. */
std::string storedIn(const char* file, const char* name) {
    EXPECT_EQ(platform::openProperties(file), std::nullopt);
    char value[PROP_VALUE_MAX];
    property_get(name, value, "");
    platform::closeProperties();
    return value;
}

class ReplayTest : public ReplayToolTest {
protected:
    /** Plays the lines as "trace", as JSON Lines. */
    Played play(const Lines& trace) const {
        write("trace", joined(trace));
        return run("--json trace");
    }
};

TEST_F(ReplayTest, RunsWhatIsDueBeforeALineAndHoldsTheWorkerWithinAMoment) {
    // The load is due at 2000, the save at 2500; the report at 2500 finds the saved count, and its
    // reset comes before a save of the same moment's sample.
    const Played played = play({sample("0"), sample("2000"), report("2500"), sample("2500"),
                                report("2500"), R"({"at": 9000})"});
    EXPECT_EQ(happened(played), (Lines{saved("500", 1), saved("2500", 2), reported("2500", 2),
                                       reported("2500", 1), saved("3000", 0)}));
    EXPECT_EQ(played.status, 0);
}

TEST_F(ReplayTest, EndsAtTheLastLineWithWhatIsDueAtThatMoment) {
    EXPECT_EQ(happened(play({sample("0"), R"({"at": 500})"})), (Lines{saved("500", 1)}));
    EXPECT_EQ(happened(play({sample("0"), R"({"at": 499.999999})"})), (Lines{}));
}

TEST_F(ReplayTest, AProcessBootKeepsTheClockAndThePropertiesADeviceBootOnlyWhatPersists) {
    const Played played =
            play({line("0", R"("property": {"persist.zuno.rgb.shot.count": "7"})"), sample("1000"),
                  boot("1500", "process"), sample("1500"), boot("1500", "process"),
                  line("1500", R"("call": "SDCImpl.getInstance")"), report("3500"), sample("3600"),
                  boot("7", "device"), report("8")});
    // What was due at 1500 ran before the boot line; what was posted at 1500 is lost with its
    // process.
    EXPECT_EQ(played.out, joined({boot("0", "device"), saved("1500", 1), boot("1500", "process"),
                                  boot("1500", "process"), reported("3500", 1), boot("7", "device"),
                                  reported("8", 0)}));

    const std::string set =
            line("0", R"("property": {"sys.x": "1", "ro.x": "2", "persist.x": "3"})");
    for (const auto& [kind, kept] : {std::pair("process", "123"), std::pair("device", "23")}) {
        write("trace", joined({set, boot("0", kind)}));
        EXPECT_EQ(run("--properties store trace").status, 0);
        std::string stored;
        for (const char* name : {"sys.x", "ro.x", "persist.x"}) stored += storedIn("store", name);
        EXPECT_EQ(stored, kept) << kind;
    }
}

TEST_F(ReplayTest, PlaysSeveralFilesAsIfADeviceBootJoinedThem) {
    write("one", joined({line("100", R"("property": {"sys.x": "1", "ro.x": "2"})"), sample("100"),
                         R"({"at": 700})"}));
    write("two", "# nothing\n");
    write("three", joined({line("5", R"("call": "SDCImpl.getInstance")"), report("2005")}));
    const auto in = [](const std::string& file, const std::string& each) {
        return each.substr(0, each.size() - 1) + R"(, "file": ")" + file + "\"}";
    };
    const std::string expected =
            joined({in("one", boot("100", "device")), in("one", saved("600", 1)),
                    in("three", boot("5", "device")), in("three", reported("2005", 1))});
    EXPECT_EQ(run("--json one two three").out, expected);
    EXPECT_EQ(run("--json one - three", "# nothing\n").out, expected);
    EXPECT_EQ(run("--json --properties store one").status, 0);
    EXPECT_EQ(storedIn("store", "sys.x") + storedIn("store", "ro.x"), "12");
    EXPECT_EQ(happened(run("--json --properties store three")), (Lines{reported("2005", 1)}));
    EXPECT_EQ(storedIn("store", "sys.x") + storedIn("store", "ro.x"), "2");
}

TEST_F(ReplayTest, CapturesAreDevicesOfTheirOwnAndPrintInTheirOrderHoweverManyPlayAtOnce) {
    const std::string capture = "capture";
    writeCapture(capture);
    write("day", joined({sample("0"), R"({"at": 700})"}));
    write("later", joined({line("0", R"("call": "SDCImpl.getInstance")"), report("2000")}));
    const std::string files = "day " + capture + ' ' + capture + " later missing " + capture;
    const Played one = run("--json --jobs 1 " + files);
    const Played three = run("--json --jobs 3 " + files);
    EXPECT_EQ(one.out, three.out);
    EXPECT_EQ(one.err, three.err);
    EXPECT_EQ(three.status, 2);
    EXPECT_NE(three.err.find("missing: cannot open"), std::string::npos) << three.err;
    const std::string alone = run("--json " + capture).out;
    const size_t lines = static_cast<size_t>(std::count(alone.begin(), alone.end(), '\n'));
    EXPECT_EQ(happened(three).size(), 2 * (lines - 1) + 2);
    EXPECT_NE(happened(three).back().find("count:1"), std::string::npos);

    // Days of one device stay so behind a comment, and captures on one store come one by one.
    write("day", "# one\n" + sample("0") + "\n{\"at\": 700}\n");
    write("next",
          "# two\n" + line("0", R"("call": "SDCImpl.getInstance")") + '\n' + report("2000") + '\n');
    EXPECT_EQ(happened(run("--json --jobs 2 day next")).back(),
              happened(run("--json --jobs 1 day next")).back());
    const std::string ultrasonic = "persist.zuno.ultra.phone.enable.count";
    write("used", line("0", R"("property": {")" + ultrasonic + R"(": "7"})") + '\n');
    std::string outputs[2];
    for (const char* jobs : {"1", "4"}) {
        const std::string options = std::string("--json --jobs ") + jobs + " --properties " + jobs;
        EXPECT_EQ(run(options + " used").status, 0);
        const Played played =
                run(options + ' ' + capture + ' ' + capture + ' ' + capture + ' ' + capture);
        EXPECT_EQ(played.status, 0);
        outputs[*jobs == '4'] = played.out;
        EXPECT_EQ(storedIn(jobs, ultrasonic.c_str()), "0") << "the capture's mornings reset it";
        EXPECT_EQ(storedIn(jobs, "persist.zuno.wechat.count.info"), "0_0_0_0");
    }
    EXPECT_EQ(outputs[0], outputs[1]);
}

TEST_F(ReplayTest, AKilledProcessIsAnErrorAndAKilledToolTakesItsProcessesAlong) {
    // Nobody reads the output, so that the tool and those that play for it come to a stop.
    ASSERT_EQ(mkfifo("lines", 0600), 0);
    writeCapture("capture");
    std::string captures;
    for (int i = 0; i < 80; ++i) captures += " capture";
    const std::string killPlayers =
            " >lines 2>errors & exec 3<lines; read -r line <&3; "
            "kill -9 $(cat /proc/$!/task/$!/children); cat <&3 >rest; wait $!; echo $?";
    EXPECT_EQ(run("--json --jobs 2" + captures + killPlayers).out, "1\n");
    EXPECT_NE(read("errors").find(": the process died\n"), std::string::npos) << read("errors");

    ASSERT_EQ(mkfifo("pipe", 0600), 0);
    const std::string killAll =
            " pipe >played & exec 3>pipe; trap '' PIPE; echo '" + report("9") +
            "' >&3; until grep -q event played; do :; done; kill -9 $!; "
            "while echo >&3; do :; done 2>errors; echo over";  // nobody reads the trace any more
    EXPECT_EQ(run("--json" + killAll).out, "over\n");
}

TEST_F(ReplayTest, ChecksExpectationsInOrderAndWithoutTheirTimes) {
    const auto expect = [](const std::string& at, const std::string& output) {
        return line(at, R"("expect": {)" + output.substr(output.find(", ") + 2));
    };
    const std::string event = expect("401", reported("400", 1));
    const std::string stored = expect("520.5", saved("500", 0));
    const std::string end = R"({"at": 600})";
    const struct {
        Lines expectations;
        int status;
        std::string message;
    } kCases[] = {
            {{event, stored, end}, 0, ""},
            {{event, end, expect("600", saved("1", 0))}, 0, ""},
            {{expect("401", reported("400", 2)), stored, end},
             3,
             "trace:3: the replay differs\n"
             R"(  expected: {"at": 401, "event": {"module": "N273", "id": "N273|10009", )"
             R"("payload": "count:2"}})"
             "\n"
             R"(  replayed: {"at": 400, "event": {"module": "N273", "id": "N273|10009", )"
             R"("payload": "count:1"}})"
             "\n"},
            {{expect("401", saved("500", 0)), event, end}, 3, "trace:3: the replay differs\n"},
            {{event, end}, 3, "trace: the replay differs\n  expected: nothing more\n"},
            {{event, stored}, 3, "trace:4: the replay differs\n"},  // time does not pass
            {{end}, 3, "expected: nothing more\n"},
            {{event, R"({"at": 500})"}, 3, "expected: nothing more\n"},
            {{event, expect("400", saved("1", 0))}, 2, R"("at" goes back, from 401 to 400)"},
            {{event, R"({"at": 401, "expect": {"event": {"module": "N273"}}})"}, 2, "lacks a key"},
            {{R"({"at": 401, "expect": {"log": {}}})"}, 2, R"(the unknown key "log")"},
    };
    for (const auto& [expectations, status, message] : kCases) {
        Lines trace{sample("0"), report("400")};
        trace.insert(trace.end(), expectations.begin(), expectations.end());
        write("trace", joined(trace));
        const Played played = run("--check trace");
        EXPECT_EQ(played.status, status) << joined(trace) << played.err;
        EXPECT_NE(played.err.find(message), std::string::npos) << played.err;
        EXPECT_EQ(played.out, status == 0 ? "trace: 2 expectations met\n" : "");
    }
    const std::string noted = R"({"note": {"hang": {"from": 3}}, )" + event.substr(1);
    write("trace", joined({sample("0"), report("400"), noted, stored, end}));
    EXPECT_NE(run("--check trace").out.find("trace:3: what began at 3 ms hung"), std::string::npos);
    write("trace", sample("0") + "\n");
    EXPECT_EQ(run("--check trace").err, "trace: nothing to check: no \"expect\" lines\n");
}

TEST_F(ReplayTest, NothingIsLostOfMoreThanPassesAtOnce) {
    constexpr size_t kEvents = 500;
    Lines trace{line("0", R"("call": "UltraException.doAction", "args": [3, {"packageName": ")" +
                                  std::string(1000, 'a') + "\"}]")};
    for (size_t i = 1; i <= kEvents; ++i) {
        trace.push_back(
                line(std::to_string(i), R"("call": "UltraException.doAction", "args": [4, {}])"));
    }
    EXPECT_EQ(happened(play(trace)).size(), 2 * kEvents + 1) << "each with a property";
}

TEST_F(ReplayTest, LaysOutLinesForAPerson) {
    write("trace", joined({sample("86400000"), report("86410000.5")}));
    EXPECT_EQ(run("--log trace").out,
              "day 2 00:00:00.000  boot      device\n"
              "day 2 00:00:00.500  property  persist.zuno.rgb.shot.count = 1\n"
              "day 2 00:00:10.000500000  event     N273|10009 count:1\n");
}

TEST_F(ReplayTest, NamesABadLineAndKeepsWhatWasDoneBeforeIt) {
    for (const auto& [bad, what] : std::vector<std::pair<std::string, std::string>>{
                 {"nonsense", "not valid JSON"},
                 {"{\"at\": 1, \"property\": {\"\xff\": \"\"}}", "not valid JSON"},
                 {R"({"at": 0})", R"("at" goes back, from 1 to 0)"},
                 {R"({"at": 0, "boot": "process"})", R"("at" goes back, from 1 to 0)"},
                 {R"({"at": 1, "call": "SDCImpl.nothing"})",
                  R"(unknown call "SDCImpl.nothing")"}}) {
        const Played played = play({"# first", report("1"), bad, report("1")});
        EXPECT_EQ(played.status, 2) << bad;
        EXPECT_EQ(played.err.find("trace:3: "), 0u) << bad << '\n' << played.err;
        EXPECT_NE(played.err.find(what), std::string::npos) << bad << '\n' << played.err;
        EXPECT_EQ(played.err.find('\n'), played.err.size() - 1) << played.err;
        EXPECT_EQ(happened(played), (Lines{reported("1", 0)})) << bad;
    }
}

TEST_F(ReplayTest, ABadLineKeepsEvenWhatIsDueFromRunningAndABadFirstOneStartsNothing) {
    const std::string post = line("0", R"("call": "SDCImpl.notifySdcReset", "args": [23])");
    EXPECT_EQ(happened(play({post})).size(), 1u);
    EXPECT_EQ(happened(play({post, R"({"at": 0, "x": 1})"})), (Lines{}));
    const Played played = play({"", "{}", report("0")});
    EXPECT_EQ(played.out, "");
    EXPECT_EQ(played.err, "trace:2: \"at\" is missing\n");
}

TEST_F(ReplayTest, NamesFilesThatItCannotUse) {
    write("trace", report("0") + "\n");
    write("broken", "not a database, and long enough to be told from one that is empty");
    for (const auto& [arguments, what] : std::vector<std::pair<std::string, std::string>>{
                 {"missing", "missing: cannot open: No such file or directory\n"},
                 {".", ".:1: cannot read: Is a directory\n"},
                 {"--properties broken trace", "broken: cannot keep properties in this file: "},
                 {"--properties no/where trace", "no/where: cannot keep properties in this file: "},
                 {"--print-trace trace", "trace: not a device capture\n"},
                 {"", "FILE is missing"}}) {
        const Played played = run(arguments);
        EXPECT_EQ(played.status, 2) << arguments;
        EXPECT_EQ(played.out, "") << arguments;
        EXPECT_NE(played.err.find(what), std::string::npos) << played.err;
    }
    EXPECT_EQ(run("--json trace missing").out.empty(), false);
}

TEST_F(ReplayTest, StopsAtTheLineAtWhichTheStoreCannotBeWritten) {
    Lines samples;
    for (int i = 0; i < 40; ++i) samples.push_back(sample(std::to_string(1000 * i)));
    write("trace", joined(samples));
    rlimit limit{};
    getrlimit(RLIMIT_FSIZE, &limit);
    const rlimit full{60'000, limit.rlim_max};
    setrlimit(RLIMIT_FSIZE, &full);
    const Played played = run("--json --properties store trace");
    setrlimit(RLIMIT_FSIZE, &limit);
    EXPECT_EQ(played.status, 2);
    // The count of one line is saved while time passes to the next.
    const size_t saves = happened(played).size();
    EXPECT_GT(saves, 3u);
    EXPECT_EQ(played.err, "trace:" + std::to_string(saves + 2) +
                                  ": store: cannot keep properties in this file: disk I/O error\n");
    EXPECT_EQ(storedIn("store", "persist.zuno.rgb.shot.count"), std::to_string(saves));
}

TEST_F(ReplayTest, AStoreThatGoesAwayWhileTheReplayRunsIsAnError) {
    ASSERT_EQ(mkfifo("pipe", 0600), 0);
    for (const auto& [deed, status] : std::vector<std::pair<std::string, int>>{
                 {":", 0}, {"rm store", 2}, {"cp store new; mv new store", 2}}) {
        for (const char* next : {"", R"({"at": 9, "boot": "process"})"}) {
            // The trace goes on once the first line was carried out.
            const Played played =
                    run("--json --properties store pipe >lines 2>errors & exec 3>pipe; echo '" +
                        report("9") + "' >&3; until grep -q event lines; do :; done; " + deed +
                        "; echo '" + next + "' >&3; exec 3>&-; wait $!");
            EXPECT_EQ(played.status, status) << deed << next;
        }
    }
}

}  // namespace
