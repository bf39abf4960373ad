#include <algorithm>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <utility>

#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "tests/ReplayTool.h"

namespace {

constexpr char kCapture[] = EXAMPLES "/registrations.capture.txt";
constexpr char kThreeBoots[] = EXAMPLES "/three-boots.jsonl";
constexpr char kReport[] = R"({"at": 0, "call": "SDCImpl.putRgbShotTally", "args": [7]})"
                           "\n";

size_t count(const std::string& text, const std::string& part) {
    size_t number = 0;
    for (size_t at = text.find(part); at != text.npos; at = text.find(part, at + 1)) ++number;
    return number;
}

std::string contents(const std::string& file) {
    std::ifstream stream(file);
    return {std::istreambuf_iterator<char>(stream), {}};
}

class ReplayOutputTest : public ReplayToolTest {
protected:
    ReplayOutputTest() {
        write("good", kReport);
        write("bad", std::string(kReport) + "{}\n" + kReport);
    }
};

TEST_F(ReplayOutputTest, EachKindOfLineIsLaidOutForAPerson) {
    write("trace", R"({"at": 59999, "set": {"mLogSwitch": 1}}
{"at": 61001, "call": "RgbShotManager.stopRgbThread"}
{"at": 3661002.000001, "call": "FlowingDataException.notifyBootCompleted"}
{"at": 90061003.5, "call": "FlowingDataException.setSensorException", "args": [2, -5]}
{"at": 90061003.5, "call": "UltraException.doAction", "args": [3, {"packageName": "é\t b\u0001\u007f\n  c\\\u001b[1m"}]}
{"at": 90061004, "call": "UltraException.doAction", "args": [4, {}]}
)");
    EXPECT_EQ(run("--log trace").out,
              "day 1 00:00:59.999  boot      device\n"
              "day 1 00:01:01.001  log       I UL: isTestMode = 0\n"
              "day 1 00:01:01.001  result    RgbShotManager.stopRgbThread = true\n"
              "day 1 01:01:01.002000001  log       D sd resetDetectCount\n"
              "day 1 01:01:01.002000001  property  persist.zuno.flow.detect.count = 0,0,0,0,0,0\n"
              "day 2 01:01:01.003500000  log       E SDC Event = N273|10005\n"
              "day 2 01:01:01.003500000  event     N273|10005 reason:-5\n"
              "day 2 01:01:01.003500000  property  persist.zuno.ultra.enable.count = 1\n"
              "day 2 01:01:01.004  log       E SDC Event = N273|10011\n"
              "day 2 01:01:01.004  event     N273|10011 TempInvalidRate:1/1&pkg:é b??? c\\?[1m"
              "&ultraEnergy:0/0&ultraExpired:101\n"
              "day 2 01:01:01.004  property  persist.zuno.device.invalid.count = 1\n");
}

TEST_F(ReplayOutputTest, ABadFileEndsTheReplayAndKeepsWhatCameBefore) {
    write("noCapture", "no capture\n");
    const std::string capture = "capture";
    writeCapture(capture);
    const struct {
        std::string files;
        size_t boots;
        size_t reports;
        const char* error;
    } kCases[] = {
            {"good good", 2, 2, ""},
            {"good bad good", 2, 2, "bad:2: "},
            {"good good bad", 3, 3, "bad:2: "},
            {"bad good", 1, 1, "bad:2: "},
            {"good missing good", 1, 1, "missing: cannot open"},
            {"good good missing", 2, 2, "missing: cannot open"},
            {"noCapture good", 0, 0, "noCapture"},
            {"good noCapture good", 1, 1, "noCapture"},
            {capture + " good bad " + capture, 3, 3, "bad:2: "},
            {capture + ' ' + capture + " noCapture " + capture + " good", 2, 2, "noCapture"},
            {capture + " noCapture", 1, 1, "noCapture"},
    };
    for (const auto& [files, boots, reports, error] : kCases) {
        const Played one = run("--json --jobs 1 " + files);
        EXPECT_EQ(one.status, *error == '\0' ? 0 : 2) << files;
        EXPECT_EQ(count(one.out, R"("boot": "device")"), boots) << files << '\n' << one.out;
        EXPECT_EQ(count(one.out, "N273|10009"), reports) << files;
        EXPECT_EQ(count(one.out, ", \"file\": "), count(one.out, "\n")) << files;
        EXPECT_NE(one.err.find(error), std::string::npos) << one.err;
        const Played three = run("--json --jobs 3 " + files);
        EXPECT_EQ(three.status, one.status) << files;
        EXPECT_EQ(three.out, one.out) << files;
        EXPECT_EQ(three.err, one.err) << files;
    }
}

TEST_F(ReplayOutputTest, WrongArgumentsAreRefusedBeforeAnythingIsPlayed) {
    symlink("good", "link");
    symlink("p", "link2");
    for (const char* arguments :
         {"", "--json --log good", "--check --log good", "--check --json good",
          "--check --print-trace good", "--jobs 0 good", "--jobs x good", "--page good good",
          "--timeline ./link good", "--page p --uses ./p good", "--page p --print-trace good",
          "--baseline bad --log good", "--properties p --page link2 good", "--nothing good"}) {
        const Played played = run(arguments);
        EXPECT_EQ(played.status, 2) << arguments;
        EXPECT_EQ(played.out, "") << arguments;
        EXPECT_NE(played.err, "") << arguments;
    }
    const Played calls = run("--list-calls");
    EXPECT_EQ(calls.status, 0);
    EXPECT_NE(calls.out.find("SDCImpl.putRgbShotTally [integer]\n"), std::string::npos);
    EXPECT_EQ(run("--version").status, 0);
}

TEST_F(ReplayOutputTest, AFileThatCannotBeWrittenIsNamedBeforeAnythingIsPlayedIfItCanBe) {
    for (const char* option : {"--page", "--timeline"}) {
        for (const auto& [file, why] : {std::pair("/dev/full", "No space left on device"),
                                        std::pair("no/where", "No such file or directory"),
                                        std::pair(".", "Is a directory")}) {
            const Played played = run(std::string(option) + ' ' + file + ' ' + kThreeBoots);
            EXPECT_EQ(played.status, 2) << option << file;
            EXPECT_EQ(played.err, std::string(file) + ": cannot write: " + why + "\n");
            const bool isPlayed = played.out.find("\nPlayed 3 boots, ") != std::string::npos;
            EXPECT_EQ(isPlayed, std::string(file) == "/dev/full");
        }
    }
    EXPECT_EQ(run("--json good >/dev/full 2>error; echo $?").out, "1\n");
    EXPECT_EQ(contents("error"), "cannot write standard output: No space left on device\n");
}

TEST_F(ReplayOutputTest, NothingIsWholeThatADiskCutsShort) {
    // A page or a timeline that is smaller than a buffer fails as late as at its end.
    for (const char* option : {"--timeline", "--uses", "--since-charge"}) {
        const Played played = run(std::string(option) + " /dev/full good");
        EXPECT_EQ(played.status, 2) << option;
        EXPECT_EQ(played.err, "/dev/full: cannot write: No space left on device\n") << option;
    }
    // The kernel writes what fits, and refuses the rest with a signal.
    rlimit usual{};
    getrlimit(RLIMIT_FSIZE, &usual);
    const rlimit small{1000, usual.rlim_max};
    setrlimit(RLIMIT_FSIZE, &small);
    const Played cut = run(std::string("--json ") + kThreeBoots);
    const Played table =
            run(std::string("--uses uses ") + kThreeBoots + " >/dev/null 2>error; echo $?");
    setrlimit(RLIMIT_FSIZE, &usual);
    EXPECT_EQ(cut.status, 1);
    EXPECT_EQ(cut.out.size(), 1000u);
    EXPECT_EQ(cut.err, "cannot write standard output: File too large\n");
    EXPECT_EQ(table.out, "2\n");
    EXPECT_EQ(contents("error"), "uses: cannot write: File too large\n");
    EXPECT_EQ(access("uses", F_OK), -1);
}

TEST_F(ReplayOutputTest, AReplayThatStopsLeavesWhatWasThere) {
    write("page", "old");
    chmod("page", 0640);
    mkdir("folder", 0700);
    symlink("../page", "folder/link");
    const Played played = run("--page page --timeline timeline bad");
    EXPECT_EQ(played.status, 2);
    EXPECT_NE(played.out.find("\nStopped after 1 boot, 0:00:00 of"), std::string::npos);
    EXPECT_EQ(contents("page"), "old");
    EXPECT_EQ(access("timeline", F_OK), -1);
    EXPECT_EQ(run("--page folder/link good").status, 0);
    EXPECT_NE(contents("page"), "old") << "through the link";
    struct stat info {};
    EXPECT_EQ(stat("page", &info), 0);
    EXPECT_EQ(info.st_mode & 07777, 0640U);

    const Played checked = run("--check bad");
    EXPECT_EQ(checked.status, 2);
    EXPECT_EQ(checked.out, "");
    EXPECT_EQ(checked.err, "bad:2: \"at\" is missing\n");
    write("first", "{}\n");
    EXPECT_EQ(run("first").out, "") << "nothing was played";
}

TEST_F(ReplayOutputTest, ATableHasAllDecimalsOfAMomentAndNothingOfWhatIsNotKnown) {
    write("dated", R"({"at": 0, "note": {"capture": {"midnight": "2024-03-05", "knownTo": 9000}}}
{"at": 1000.05, "call": "SDCImpl.enableSuccess", "args": [true, 1, "a,\"b", "c", 1000]}
{"at": 2000.000001, "call": "SDCImpl.enableSuccess", "args": [false, 1, "a,\"b", "c", 0]}
)");
    EXPECT_EQ(run("--uses uses dated").status, 0);
    EXPECT_NE(contents("uses").find(R"(,"a,""b",,,1,,,,c,2024-03-05T00:00:01.00005,)"
                                    "2024-03-05T00:00:02.000000001,1000.05,2000.000001,0,off,1,1,"
                                    "1000000,,0.999,0,,\r\n"),
              std::string::npos)
            << contents("uses");
}

TEST_F(ReplayOutputTest, TheSummaryShowsTwentyRowsOrAll) {
    const std::string some = run(kThreeBoots).out;
    EXPECT_EQ(count(some, "app.11"), 1u);
    EXPECT_EQ(count(some, "app.12"), 0u);
    EXPECT_EQ(count(some, "  and 6 more (--all shows them)\n"), 1u);
    const std::string all = run(std::string("--all ") + kThreeBoots).out;
    EXPECT_EQ(count(all, "app.20"), 0u);
    EXPECT_EQ(count(all, "app.18"), 1u);
    EXPECT_EQ(count(all, "--all"), 0u);
}

TEST_F(ReplayOutputTest, ColoursAreForATerminalUnlessTheyAreNotWanted) {
    EXPECT_EQ(run("good").out.find('\x1b'), std::string::npos);
    for (const auto& [variable, colours] :
         {std::pair("-u NO_COLOR", true), {"NO_COLOR=", true}, {"NO_COLOR=0", false}}) {
        const std::string shown = run(std::string("good >plain; script -qec \"env ") + variable +
                                      " '" + SENSOR_REPLAY + "' good\" /dev/null")
                                          .out;
        EXPECT_EQ(shown.find("\x1b[1mgood\x1b[0m") != std::string::npos, colours) << shown;
    }
}

TEST_F(ReplayOutputTest, ATraceIsToldByItsFirstBraceAndMustNotBePacked) {
    write("indented", "\xEF\xBB\xBF\n# day\n \t" + std::string(kReport));
    EXPECT_EQ(run("--json indented").status, 0);
    EXPECT_EQ(run("--json -", kReport).status, 0);
    const Played packed = run("good >plain; gzip good; '" SENSOR_REPLAY "' --json good.gz");
    EXPECT_EQ(packed.status, 2);
    EXPECT_EQ(packed.err, "good.gz: a trace must be plain UTF-8, not packed or UTF-16\n");
}

TEST_F(ReplayOutputTest, TracesOfSeveralCapturesAreJoinedByABoot) {
    const std::string capture = kCapture;
    const Played printed = run("--print-trace " + capture + ' ' + capture);
    EXPECT_EQ(printed.status, 0);
    EXPECT_EQ(count(printed.out, R"("boot": "device")"), 1u);
    write("trace", printed.out);
    const Played played = run("--json trace");
    EXPECT_EQ(played.status, 0) << played.err;
    EXPECT_EQ(count(played.out, R"("boot": "device")"), 2u);
}

}  // namespace
