#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "day/Journal.h"
#include "report/DayRows.h"
#include "report/FindingText.h"
#include "report/Sections.h"

namespace {

using trace::Record;
using Kind = Record::Kind;

constexpr int64_t kMinute = 60'000'000'000;
constexpr size_t kAll = 100;

constexpr char kScreenCapture[] = R"({
        "capture": {"midnight": "2024-03-05", "taken": "2024-03-05 10:00:00", "knownTo": 36000000,
                    "bound": "stamp"},
        "known": {"display": [{"from": 0, "to": 36000000}],
                  "charge": [{"from": 0, "to": 36000000}]},
        "sensors": [
            {"handle": 1, "name": "Acc", "type": 65537, "mode": "continuous", "maxRate": 100},
            {"handle": 2, "name": "Gyro", "type": 65538, "mode": "continuous"},
            {"handle": 3, "name": "Steps", "type": 65539, "mode": "on-change", "wakeUp": true,
             "maxRate": 5},
            {"handle": 4, "name": "Motion", "type": 65540, "mode": "one-shot", "wakeUp": true}],
        "packages": [{"uid": 1, "names": ["com.a"]}, {"uid": 2, "names": ["com.b", "com.c"]}]})";

constexpr char kTaken[] = R"({"taken": {
        "connections": [
            {"pkg": "com.a.x", "uid": 1, "handle": 1},
            {"pkg": "com.a.x", "uid": 1, "handle": 2},
            {"pkg": "tag", "uid": 2, "handle": 3, "count": 2, "hasAccess": false, "wakeLocks": 1},
            {"pkg": "late", "uid": 3, "handle": 9}],
        "direct": [{"package": "com.vr", "sensors": 2, "rates": [1, 7]}],
        "operatingMode": "RESTRICTED",
        "refused": [{"pkg": "late", "uid": 3, "handle": 1, "count": 3, "result": "BUSY"}],
        "sinceCharge": {"onBatteryMs": 36000000, "rows": [
            {"uid": 9, "handle": -10000, "ms": 1000, "count": 1},
            {"uid": 1, "handle": 1, "ms": 18000000, "count": 0, "backgroundMs": 9000000,
             "shared": true}]}}})";

/** What a client does; without a tag it is a note alone. */
struct Line {
    int64_t minute;
    bool isOn;
    std::string tag;
    int64_t periodNs;
    std::string note;
};

/** A capture from 4 to 10 o'clock, the display on for the first half hour only. */
day::Journal journalOf(const std::vector<Line>& lines) {
    day::JournalWriter writer;
    writer.begin("input");
    const auto at = [](int64_t minute) { return (240 + minute) * kMinute; };
    writer.take({Kind::kBoot, at(0)});
    writer.take({Kind::kNote, at(0), {kScreenCapture}});
    writer.take({Kind::kState, at(0), {}, 1, static_cast<int32_t>(trace::DeviceState::kDisplay)});
    writer.take({Kind::kState, at(0), {}, 2, static_cast<int32_t>(trace::DeviceState::kCharge)});
    bool isDark = false;
    for (const Line& line : lines) {
        if (line.minute >= 30 && !isDark) {
            isDark = true;
            writer.take({Kind::kState, at(30), {}, 0, 0});
            writer.take({Kind::kState,
                         at(60),
                         {},
                         0,
                         static_cast<int32_t>(trace::DeviceState::kCharge)});
        }
        if (line.tag.empty()) {
            writer.take({Kind::kNote, at(line.minute), {line.note}});
            continue;
        }
        writer.take({line.isOn ? Kind::kEnable : Kind::kDisable,
                     at(line.minute),
                     {line.tag, line.tag, line.note},
                     line.periodNs,
                     65537});
    }
    writer.take({Kind::kNote, at(360), {kTaken}});
    writer.take({Kind::kOver, at(400)});
    return writer.end();
}

const std::vector<Line> kLines = {
        {0, true, "com.a.x", 0, R"({"handle": 1, "uid": 1, "batchUs": -1, "before": true})"},
        {0, true, "tag", 500'000'000,
         R"({"handle": 3, "uid": 2, "batchUs": 0, "before": true, "rateKnown": false})"},
        {1, true, "com.b", 20'000'000, R"({"handle": 2, "uid": 2, "batchUs": 1500000})"},
        {2, true, "shot", 0, R"({"handle": 4, "uid": 1, "batchUs": 0})"},
        {3, false, "com.b", 0, R"({"handle": 2, "uid": 2})"},
        {60, true, "dead", 20'000'000, R"({"handle": 1, "uid": 5, "batchUs": 200000})"},
        {90, false, "", 0, R"({"end": {"pkg": "shot", "uid": 1, "handle": 4, "how": "fired"}})"},
        {115, false, "", 0, R"({"end": {"pkg": "dead", "uid": 5, "handle": 1, "how": "unseen"}})"},
};

TEST(ScreenTest, FindingsComeByTheirWeightAndNeverMoreThanSeven) {
    std::vector<Line> lines = kLines;
    EXPECT_EQ(
            report::describeFindings(journalOf(lines)),
            (std::vector<std::string>{
                    "com.a (x) held Acc for 5:30:00 with the display off.",
                    ("com.b +1 (tag) held Steps, which wakes the phone, for 5:30:00 with the "
                     "display off and without batching."),
                    ("com.a (x) had Acc on all through, since before 2024-03-05 04:00:00: for at "
                     "least 6:00:00."),
                    ("com.b +1 (tag) had Steps on all through, since before 2024-03-05 04:00:00: "
                     "for at least 6:00:00."),
                    "dead went without switching Acc off, once: it was on for 0:55:00 at most.",
                    "The device refused late to switch Acc on, 3 times: BUSY.",
                    ("Only 6:00:00 is seen of the 10:00:00 from 2024-03-05 00:00:00 to 2024-03-05 "
                     "10:00:00: of the rest nothing is told."),
            }))
            << "no access has no place: what is not seen always has";
}

TEST(ScreenTest, TheTablesSayWhatIsKnownAndMarkWhatIsNot) {
    const day::Journal journal = journalOf(kLines);
    EXPECT_EQ("\n" + report::dayTable(journal.table.rowsOf({0, 0}), kAll).text(0), R"(
App             Sensor      Held             Display  Enables     Hz                Batch  Wake  Samples
com.b +1        Gyro     0:02:00  0:02:00 of 0:02:00        1   50.0                1.5 s
com.a (x)       Acc     ≥6:00:00  0:30:00 of 6:00:00        1  100.0  as long as possible           2.2M  still on
dead            Acc     ≤0:55:00  0:00:00 of 0:55:00        1   50.0               200 ms         165.0k
com.b +1 (tag)  Steps   ≥6:00:00  0:30:00 of 6:00:00        1      ?                    0  wake           still on
com.a (shot)    Motion   1:28:00  0:28:00 of 1:28:00        1                           0  wake           fired
)");

    const report::Section on = report::layOutOnNow(journal, 0, kAll);
    EXPECT_EQ("\n" + on.tables[0].table.text(0), R"(
App             Sensor             Since               Hz                Batch  Wake
com.a (x)       Gyro                                                                  no line tells of it
com.a (x)       Acc                before 04:00:00  100.0  as long as possible
com.b +1 (tag)  Steps              before 04:00:00      ?                    0  wake  no data access, 1 wake lock, 2 connections, rate unknown
late            handle 0x00000009                                                     no line tells of it
)");
    EXPECT_EQ(on.lines, std::vector<std::string>());
    EXPECT_EQ(on.below, (std::vector<std::string>{
                                "Operating mode: RESTRICTED",
                                "Direct channel of com.vr: 2 sensors, rate levels 1 (normal), 7"}));

    const report::Section charge = report::layOutSinceCharge(journal, 0, kAll);
    EXPECT_EQ(charge.lines, std::vector<std::string>{
                                    "The registrations cover 5:00:00 of the 10:00:00 on battery."});
    EXPECT_EQ("\n" + charge.tables[0].table.text(0), R"(
App    Sensor     Time  Of battery time  In background  Count
com.a  Acc     5:00:00             50 %           50 %      0  shared, on since before the last charge
uid 9  GPS     0:00:01              0 %                     1
)");
}

}  // namespace
