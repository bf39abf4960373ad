#include <functional>
#include <sstream>
#include <utility>

#include <gmock/gmock.h>
#include <sys/stat.h>

#include "record/Pseudonyms.h"
#include "record/Screen.h"
#include "tests/ReplayTool.h"

namespace {

using ::testing::AllOf;
using ::testing::ContainsRegex;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;

/** Records what sensor-replay does to the library while it plays a trace. */
class RecordTest : public ReplayToolTest {
protected:
    static constexpr char kRecord[] = "sensor-priv.jsonl";
    static constexpr char kKey[] = "sensor-priv.key";
    static constexpr char kOldRecord[] = "sensor-priv.old.jsonl";

    Played record(const std::string& trace, const std::string& settings = "") const {
        return run("--json -", trace,
                   "LD_PRELOAD='" SENSOR_PRIV_RECORDER "' SENSOR_PRIV_RECORD=. " + settings);
    }

    /** The lines of the record from the first call on, without those of `getInstance`. */
    std::vector<std::string> recorded(const std::string& trace) const {
        record(trace);
        std::vector<std::string> lines;
        std::istringstream text(read(kRecord));
        for (std::string line; std::getline(text, line);) {
            const bool isCall = line.find(R"("call": )") != std::string::npos;
            if (!isCall && lines.empty()) continue;
            if (line.find("getInstance") == std::string::npos) lines.push_back(line);
        }
        return lines;
    }

    void expectAgreement(const std::string& file) const {
        const Played played = run("--check " + file);
        EXPECT_EQ(played.status, 0) << played.err;
    }
};

TEST_F(RecordTest, AProcessStartsWithABootAndAllThatTheLibraryReads) {
    record(R"({"at": 7.25, "property": {"persist.zuno.rgb.shot.count": "41"}}
{"at": 7.25, "set": {"policy": 1, "luxPersist": true}}
{"at": 8.000001, "call": "SDCImpl.setRgbShotCount"})");
    std::istringstream text(read(kRecord));
    std::vector<std::string> lines;
    for (std::string line; std::getline(text, line);) lines.push_back(line);
    EXPECT_THAT(lines,
                ElementsAre(StartsWith("# "), R"({"at": 8.000001, "boot": "device"})",
                            AllOf(HasSubstr(R"("persist.zuno.rgb.shot.count": "41")"),
                                  HasSubstr(R"("ro.zuno.product.overseas": null)")),
                            AllOf(HasSubstr(R"("set": {)"), HasSubstr(R"("policy": 1,)"),
                                  HasSubstr(R"("luxPersist": true)"), HasSubstr(R"("ACL": 1)")),
                            R"({"at": 8.000001, "call": "SDCImpl.getInstance"})",
                            R"({"at": 8.000001, "call": "SDCImpl.setRgbShotCount"})"));
}

TEST_F(RecordTest, OnlyWhatComesFromOutsideIsACall) {
    // eyeChange calls setRgbShotDelay and getCurrentMs, the worker's reports setSensorException.
    EXPECT_THAT(
            recorded(R"({"at": 0, "property": {"persist.zuno.flow.detect.count": "0,7,0,0,0,0"}}
{"at": 0, "call": "FlowingDataException.notifyBootCompleted"}
{"at": 5, "call": "RgbShotManager.eyeChange"}
{"at": 9, "call": "SDCImpl.notifySdcClock", "args": [8]}
{"at": 10})"),
            ElementsAre(HasSubstr("notifyBootCompleted"), HasSubstr("eyeChange"),
                        HasSubstr("notifySdcClock"), R"({"at": 9})",
                        HasSubstr(R"("expect": {"event": {"module": "N273", "id": "N273|10004")"),
                        R"({"at": 9})",
                        R"({"at": 9, "expect": {"property": )"
                        R"({"name": "persist.zuno.flow.detect.count", "value": "0,0,0,0,0,0"}}})"));
}

TEST_F(RecordTest, VariablesAndPropertiesAreWrittenWhenTheyHaveChanged) {
    EXPECT_THAT(
            recorded(R"({"at": 1, "call": "RgbShotManager.skipLux"}
{"at": 2, "set": {"policy": 3, "mLogSwitch": 1}}
{"at": 2, "property": {"persist.sys.skip_restrict": "1"}}
{"at": 3, "call": "RgbShotManager.skipLux"}
{"at": 4, "call": "RgbShotManager.skipLux"}
{"at": 5, "call": "RgbShotManager.isTestMode"})"),
            ElementsAre(HasSubstr("skipLux"), R"({"at": 3, "set": {"mLogSwitch": 1, "policy": 3}})",
                        HasSubstr("skipLux"), HasSubstr("skipLux"),
                        R"({"at": 5, "property": {"persist.sys.skip_restrict": "1"}})",
                        HasSubstr("isTestMode")));
}

TEST_F(RecordTest, EventsAreWrittenWhileAClientHoldsTheProximitySensor) {
    const std::string event =
            R"("call": "SDCImpl.process", "args": [{"type": 1, "data": [0.1, -2, 9.80665]}]})"
            "\n";
    const std::string client = R"(8, "com.example.a", "com.example.a")";
    EXPECT_THAT(recorded(R"({"at": 1, )" + event +
                         R"({"at": 2, "call": "SDCImpl.enableSuccess", "args": [true, )" + client +
                         R"(, 5]})" + "\n" + R"({"at": 3, )" + event +
                         R"({"at": 4, "call": "SDCImpl.enableSuccess", "args": [false, )" + client +
                         R"(, 0]})" + "\n" + R"({"at": 5, )" + event),
                ElementsAre(HasSubstr("enableSuccess"),
                            R"({"at": 3, )" + event.substr(0, event.size() - 1),
                            HasSubstr("enableSuccess")));
}

TEST_F(RecordTest, SamplesGiveTheSameColoursAgainAndFailAgain) {
    const std::string trace =
            R"({"at": 0, "display": {"size": [1440, 3200], "color": [9, 130, 255]}}
{"at": 1, "call": "RgbShotManager.getScreenPixcel", "args": [[1400, 3000, 1440, 3200]]}
{"at": 2, "display": {"fault": "lock"}}
{"at": 2, "call": "RgbShotManager.getScreenPixcel", "args": [[0, 0, 8, 8]]}
{"at": 3, "display": {"fault": null}}
{"at": 3, "call": "RgbShotManager.getScreenPixcel", "args": [[-2, 0, 6, 8]]}
{"at": 4, "call": "RgbShotManager.getScreenPixcel", "args": [[0, 0, 0, 0]]}
)";
    const auto results = [](const Played& played) {
        std::vector<std::string> lines;
        for (const std::string& line : happened(played)) {
            if (line.find("result") != std::string::npos) lines.push_back(line);
        }
        return lines;
    };
    const auto expected = results(record(trace));
    EXPECT_EQ(expected.size(), 4U);
    EXPECT_EQ(results(run(std::string("--json ") + kRecord)), expected);
}

TEST_F(RecordTest, ADisplayIsTheOneThatGivesAnAverageWithPixelsOutside) {
    const int rgb[] = {97, 63, 191};
    const int rect[] = {-1, -1, 3, 3};  // nine of sixteen pixels are on the display
    record::Screen screen;
    EXPECT_EQ(screen.take(rgb, rect),
              R"("display": {"size": [1080, 2400], "color": [173, 112, 255], "fault": null})");
    EXPECT_EQ(screen.take(rgb, rect), "");
    EXPECT_EQ(screen.take(nullptr, rect), R"("display": {"fault": "capture"})");
    EXPECT_EQ(screen.take(nullptr, rect), "");
}

TEST_F(RecordTest, ProcessesAddToTheRecordAndEachBootReplays) {
    const std::string trace = R"({"at": 5000, "call": "SDCImpl.setRgbShotCount"}
{"at": 9000, "boot": "process"}
{"at": 9000, "call": "SDCImpl.getInstance"}
{"at": 12000, "call": "SDCImpl.putRgbShotTally", "args": [7]}
{"at": 12000, "boot": "device"}
{"at": 0, "call": "SDCImpl.setRgbShotCount"}
{"at": 3000})";
    record(trace);
    expectAgreement(kRecord);
    EXPECT_THAT(read(kRecord), HasSubstr(R"("payload": "count:1")"));
}

TEST_F(RecordTest, ALineThatACrashHasCutOffIsTakenBack) {
    const std::string whole = "# 2018-04-25T11:45:34Z: process 7 begins\n{\"at\": 1}\n";
    write(kRecord, whole + "{\"at\": 2, \"call\": \"SDCImpl.pro");
    record(R"({"at": 9, "call": "SDCImpl.setRgbShotCount"})");
    EXPECT_THAT(read(kRecord), StartsWith(whole + "# "));
}

TEST_F(RecordTest, PartsHoldTheirSizeAndPlayByThemselvesAndTogether) {
    std::string trace = R"({"at": 0, "call": "SDCImpl.getInstance"})"
                        "\n";
    for (int i = 1; i <= 11000; ++i) {
        trace += R"({"at": )" + std::to_string(i * 100) + R"(, "call": "SDCImpl.)" +
                 (i % 100 == 0 ? R"(putRgbShotTally", "args": [7]})" : R"(setRgbShotCount"})") +
                 '\n';
    }
    record(trace, "SENSOR_PRIV_RECORD_MB=1");
    const std::string oldPart = read(kOldRecord);
    const std::string part = read(kRecord);
    EXPECT_GT(oldPart.size(), 400U << 10);
    EXPECT_LE(oldPart.size(), 512U << 10);
    EXPECT_THAT(part.substr(0, 2000), AllOf(HasSubstr("goes on in a new part\n"),
                                            HasSubstr(R"("call": "SDCImpl.getInstance")"),
                                            HasSubstr("# end of its start\n")));
    expectAgreement(kOldRecord);
    EXPECT_EQ(run(std::string("--json ") + kRecord).status, 0);
    write("whole", oldPart + part.substr(part.find("# end of its start\n")));
    expectAgreement("whole");
}

TEST_F(RecordTest, AFileThatIsNotItsOwnKeepsEveryByteAndNobodyWaitsForIt) {
    const std::string trace = R"({"at": 0, "call": "SDCImpl.setRgbShotCount"}
{"at": 1, "call": "RgbShotManager.isEmpty"})";
    const Played alone = run("--json -", trace);
    write("foreign", "no record");
    const struct {
        const char* what;
        std::function<void()> make;
        const char* settings;
    } cases[] = {
            {"a missing folder", [] {}, "SENSOR_PRIV_RECORD=missing"},
            {"a FIFO", [] { mkfifo(kRecord, 0600); }, ""},
            {"a link", [] { std::filesystem::create_symlink("foreign", kRecord); }, ""},
            {"a folder", [] { std::filesystem::create_directory(kRecord); }, ""},
            {"a text", [] { std::filesystem::copy_file("foreign", kRecord); }, ""},
            {"no key", [] { std::filesystem::copy_file("foreign", kKey); },
             "SENSOR_PRIV_RECORD_REDACT=1"},
    };
    for (const auto& [what, make, settings] : cases) {
        SCOPED_TRACE(what);
        make();
        const Played played = record(trace, settings);
        EXPECT_EQ(played.out, alone.out);
        EXPECT_THAT(played.err, ContainsRegex("sensor-priv-record E .*nothing is recorded: [^\n]*"
                                              "sensor-priv\\.(jsonl|key) [^\n]*\n?$"));
        EXPECT_EQ(read("foreign"), "no record");
        std::filesystem::remove(kRecord);
    }
    EXPECT_EQ(read(kKey), "no record");
}

TEST_F(RecordTest, FilesAreForTheirOwnerOnlyAlsoThoseThatWereThere) {
    const auto modeOf = [](const char* file) {
        return static_cast<int>(std::filesystem::status(file).permissions());
    };
    for (const mode_t before : {0, 0666}) {
        record(R"({"at": 9, "call": "SDCImpl.setRgbShotCount"})", "SENSOR_PRIV_RECORD_REDACT=1");
        EXPECT_EQ(modeOf(kRecord), 0600) << before;
        EXPECT_EQ(modeOf(kKey), 0600) << before;
        chmod(kRecord, 0666);
        chmod(kKey, 0666);
    }
}

TEST_F(RecordTest, NoSizeThatIsNoPositiveNumberCounts) {
    // Almost half a MiB is there: with the last of these samples it is too much for 1 MiB.
    const std::string begin = "# 2018-04-25T11:45:34Z: process 7 begins\n";
    const std::string before = begin + '#' + std::string(454'900, '-') + '\n';
    std::string trace = "{\"at\": 0, \"call\": \"SDCImpl.getInstance\"}\n";
    for (int i = 0; i < 60; ++i) {
        trace += "{\"at\": 1, \"call\": \"RgbShotManager.getScreenPixcel\", \"args\": "
                 "[[0, 0, 9, 9]]}\n";
    }
    for (const char* size : {"-5", "0", "1x", "", "1"}) {
        write(kRecord, before);
        record(trace, std::string("SENSOR_PRIV_RECORD_MB=") + size);
        EXPECT_EQ(std::filesystem::exists(kOldRecord), size == std::string("1")) << size;
    }
    EXPECT_THAT(read(kOldRecord).substr(before.size()), HasSubstr("getScreenPixcel"));
    // A part begins anew, also with what the display showed for the samples of the part before.
    const std::string part = read(kRecord);
    EXPECT_THAT(part.substr(part.find("# end of its start")),
                ContainsRegex("^[^\n]*\n[^\n]*\"display\": \\{\"size\": \\[1080, 2400\\]"));
}

TEST_F(RecordTest, ARecordThatCannotBeginANewPartKeepsItsSize) {
    const std::string begin = "# 2018-04-25T11:45:34Z: process 7 begins\n";
    write(kRecord, begin + '#' + std::string(456'000, '-') + '\n');
    mkfifo(kOldRecord, 0600);
    std::string trace;
    for (int i = 0; i < 60; ++i)
        trace += R"({"at": 1, "call": "RgbShotManager.skipLux"})"
                 "\n";
    record(trace, "SENSOR_PRIV_RECORD_MB=1");
    const std::string added = read(kRecord).substr(456'000);
    EXPECT_THAT(added, ContainsRegex("the record cannot go on in a new part: [^\n]*"
                                     "\\.old\\.jsonl is no regular file\"}}}\n$"));
    EXPECT_EQ(added.find("lost"), added.rfind("lost"));
    EXPECT_EQ(std::filesystem::status(kOldRecord).type(), std::filesystem::file_type::fifo);
}

TEST(PseudonymsTest, TheHashIsTheOneThatItsAuthorsPublished) {
    // Their first vectors: the key 00 01 .. 0f, and the texts "", 00, 00 01, ... (here 15 bytes).
    const record::HashKey key{0x0706050403020100, 0x0f0e0d0c0b0a0908};
    std::string text;
    EXPECT_EQ(record::sipHash(key, text), 0x726fdb47dd0e0e31U);
    for (char c = 0; c < 15; ++c) text += c;
    EXPECT_EQ(record::sipHash(key, text), 0xa129ca6149be45e5U);
}

TEST(PseudonymsTest, NamesAreFoundWhereNamesStand) {
    record::Pseudonyms names({1, 2});
    const std::string one = names.of("1");
    const std::string slashed = names.of("a/b");
    const std::string escaped = names.of("\"\xC3\xA4\\");
    const std::pair<std::string, std::string> payloads[] = {
            {"count:1&pkg:1/a/b&time:1", "count:1&pkg:" + one + '/' + slashed + "&time:1"},
            {"days:1&pkg:a/b&shockAndChargeTime:1",
             "days:1&pkg:" + slashed + "&shockAndChargeTime:1"},
            {"TempInvalidRate:1/1&pkg:unknown&ultraEnergy:1/1&ultraExpired:1",
             "TempInvalidRate:1/1&pkg:unknown&ultraEnergy:1/1&ultraExpired:1"},
            {R"(info:{"pkg" : "1/\"\u00e4\\","totalTime" : "1"})",
             R"(info:{"pkg" : ")" + one + '/' + escaped + R"(","totalTime" : "1"})"},
            {R"(info:{"pkg" : "&time:\ud83d\ude00&pkg:x\u0000y/1"})",
             R"(info:{"pkg" : ")" + names.of("&time:\xF0\x9F\x98\x80&pkg:x") + '/' + one + R"("})"},
    };
    for (const auto& [payload, expected] : payloads) EXPECT_EQ(names.replaceIn(payload), expected);
}

TEST_F(RecordTest, NamesAreReplacedButForWhatTheLibraryLooksFor) {
    const auto enable = [](int at, bool on, const std::string& pkg, const std::string& opPkg) {
        return R"({"at": )" + std::to_string(at) +
               R"(, "call": "SDCImpl.enableSuccess", "args": [)" + (on ? "true" : "false") +
               R"(, 8, ")" + pkg + R"(", ")" + opPkg + "\", 0]}\n";
    };
    const std::string trace =
            enable(0, true, "com.example.ä\\\"pay", "com.example.shell") +
            enable(1, true, "com.tencent.mm.Call", "com.tencent.mm") +
            R"({"at": 2, "call": "UltraException.doAction", "args": [3, {"packageName": "pkg"}]}
{"at": 3, "call": "UltraException.doAction", "args": [2, {}]})"
            "\n" +
            enable(2000000, false, "com.example.ä\\\"pay", "com.example.shell");
    record(trace, "SENSOR_PRIV_RECORD_REDACT=1");
    const std::string first = read(kRecord);
    EXPECT_THAT(first,
                AllOf(Not(HasSubstr("example")), Not(HasSubstr("mm.Call")),
                      ContainsRegex(R"(8, "app-[0-9a-f]{10}\+com.tencent.mm", "com.tencent.mm")"),
                      ContainsRegex(R"(pkg:app-[0-9a-f]{10}/app-[0-9a-f]{10}&time:2000)"),
                      ContainsRegex(R"(&pkg:app-[0-9a-f]{10}&ultra)")));
    expectAgreement(kRecord);
    std::filesystem::remove(kRecord);
    record(trace, "SENSOR_PRIV_RECORD_REDACT=1");
    // The first line tells when the record began.
    const std::string second = read(kRecord);
    EXPECT_EQ(first.substr(first.find('\n')), second.substr(second.find('\n')))
            << "a folder's names stay the same";
}

}  // namespace
