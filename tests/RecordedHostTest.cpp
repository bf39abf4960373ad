#include <gmock/gmock.h>

#include "tests/ReplayTool.h"

namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::MatchesRegex;
using ::testing::Not;

/** Hosts that go wrong: the record says what is missing, and a check agrees with the rest. */
class RecordedHostTest : public ReplayToolTest {
protected:
    /** What the host `name` prints. */
    std::string live(const std::string& name, const std::string& settings = "") const {
        const Played lived =
                run("", "", "SENSOR_PRIV_RECORD=. " + settings + " '" RECORDED_HOST "' " + name);
        EXPECT_EQ(lived.status, 0) << lived.err;
        return lived.out;
    }
};

TEST_F(RecordedHostTest, WhatIsMissingStandsInTheRecordAndTheRestAgrees) {
    const auto met = [](const std::string& count) {
        return "sensor-priv.jsonl: " + count + " expectations met\n";
    };
    const auto lost = [](const std::string& why) {
        return "sensor-priv.jsonl:[0-9]+: lines are lost from [0-9]+ to [0-9]+ ms: " + why + "\n";
    };
    const std::string full = lost("the record cannot be written: File too large");
    const struct {
        const char* host;
        std::string prints;
        std::string check;  // a regular expression
    } hosts[] = {
            {"hang", "the clock goes: yes\n", met("1")},
            {"hang-long", "written meanwhile: yes\n",
             met("4001") + "sensor-priv.jsonl:[0-9]+: what began at [0-9]+ ms hung, and did the "
                           "rest later\n"},
            {"full", "", met("1") + full + met("1")},
            {"full-to-the-end", "", met("1") + full},
            {"half-written", "",
             met("1") + lost("the record cannot be written: No space left on device") + met("1")},
            {"removed", "", lost("the record was removed") + met("1")},
            {"closes", "own file: 0 bytes\n",
             met("1") +
                     "sensor-priv.jsonl: the process ends at [0-9.]+ ms; the replay does 1 more of "
                     "that moment\n" +
                     lost("the record was closed by the host") + met("1")},
            {"forks", "has the record: 1, its child: 0\n",
             met("2") + lost("process [0-9]+ was forked, and what it calls is not recorded")},
            {"forks-in-telemetry", "children: 20\n", met("20")},
            {"calls-from-log", "", met("1")},
            {"calls-from-telemetry", "", met("1")},
            {"leaves-its-folder", "", met("1")},
    };
    for (const auto& [host, prints, check] : hosts) {
        SCOPED_TRACE(host);
        std::filesystem::remove("sensor-priv.jsonl");
        EXPECT_EQ(live(host), prints);
        const Played played = run("--check sensor-priv.jsonl");
        EXPECT_EQ(played.status, 0) << played.err;
        EXPECT_THAT(played.out, MatchesRegex(check));
    }
}

TEST_F(RecordedHostTest, WhatTheHostDoesInTelemetryIsItsOwn) {
    live("calls-from-telemetry");
    EXPECT_THAT(read("sensor-priv.jsonl"),
                AllOf(HasSubstr(R"("call": "RgbShotManager.onTouchChange")"),
                      Not(HasSubstr(R"("value": "77")"))));
}

TEST_F(RecordedHostTest, WhatBeganBeforeALossIsNotToldBehindIt) {
    live("loses-while-a-message-hangs");
    EXPECT_THAT(read("sensor-priv.jsonl"),
                AllOf(HasSubstr("ultraExpired:101"), HasSubstr("goes on after a loss"),
                      Not(HasSubstr(R"("name": "persist.zuno.device.invalid.count")"))));
}

TEST_F(RecordedHostTest, PseudonymsLeakNothingAndDamageNoNumber) {
    live("names", "SENSOR_PRIV_RECORD_REDACT=1");
    const std::string record = read("sensor-priv.jsonl");
    EXPECT_THAT(record,
                AllOf(Not(HasSubstr("secret")), Not(HasSubstr("example")), Not(HasSubstr("quote")),
                      Not(HasSubstr("line\\")), HasSubstr(R"(\"totalTime\" : \"0\")")));
}

TEST_F(RecordedHostTest, ATornLastLineIsPassedOverByACheckOnly) {
    live("leaves-its-folder");
    EXPECT_THAT(read("sensor-priv.jsonl"), HasSubstr(R"("policy": 7)"));
    write("torn", read("sensor-priv.jsonl") + R"({"at": 9000000000, "cal)");
    const Played played = run("--check torn");
    EXPECT_EQ(played.status, 0) << played.err;
    EXPECT_THAT(played.out, MatchesRegex("torn: 1 expectations met\n"
                                         "torn:[0-9]+: the last line is torn; those before it "
                                         "count\n"));
    EXPECT_EQ(run("--json torn").status, 2);
}

}  // namespace
