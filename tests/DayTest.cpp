#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "day/Findings.h"
#include "day/Journal.h"
#include "day/Profile.h"
#include "day/Samples.h"
#include "report/Compare.h"
#include "report/EventText.h"
#include "report/PageDay.h"
#include "report/page/DayPicture.h"

namespace {

using day::End;
using trace::Record;
using Kind = Record::Kind;

constexpr int64_t kSecond = 1'000'000'000;
constexpr int64_t kDay = 86'400 * kSecond;

/** A record at a time in seconds. */
Record at(int64_t seconds, Kind kind, std::array<std::string_view, 3> texts = {},
          int64_t number = 0, int32_t value = 0) {
    return {kind, seconds * kSecond, texts, number, value};
}

Record on(int64_t seconds, std::string_view app, std::string_view note = {},
          int64_t periodNs = 1000, int32_t type = 1) {
    return at(seconds, Kind::kEnable, {app, app, note}, periodNs, type);
}

Record off(int64_t seconds, std::string_view app, std::string_view note = {}, int32_t type = 1) {
    return at(seconds, Kind::kDisable, {app, app, note}, 0, type);
}

Record note(int64_t seconds, std::string_view json) {
    return at(seconds, Kind::kNote, {json});
}

Record displayIs(int64_t seconds, bool isOn) {
    return at(seconds, Kind::kState, {}, isOn ? 1 : 0);
}

/** A boot of the device at 0 in which the records happen, and that ends with the last. */
day::Journal gather(const std::vector<Record>& records) {
    day::JournalWriter writer;
    writer.begin("input");
    writer.take(at(0, Kind::kBoot));
    for (const Record& record : records) writer.take(record);
    writer.take({Kind::kOver, records.back().at});
    return writer.end();
}

/** "app from-to end enables", and the display's time that was known and on. */
std::string show(const day::Use& use) {
    constexpr const char* kEnds[] = {"off", "fired", "unseen", "on"};
    const auto seconds = [](int64_t ns) { return std::to_string(ns / kSecond); };
    return use.pkg + (use.before ? " before " : " ") + seconds(use.from) + '-' + seconds(use.to) +
           ' ' + kEnds[static_cast<size_t>(use.end)] + ' ' + std::to_string(use.enables.size()) +
           ' ' + seconds(use.display.known) + '/' + seconds(use.display.on);
}

constexpr char kDayCapture[] = R"({"capture": {"knownTo": 30000}, "known": {"display": [
        {"from": 0, "to": 8000}, {"from": 5000, "to": 10000}, {"from": 20000, "to": 30000}]}})";

TEST(DayTest, UsesAreFollowedByTheirClientsToTheEndOfWhatIsKnown) {
    const char* const a = R"({"handle": 7, "uid": 1})";
    const char* const b = R"({"handle": 7, "uid": 2})";
    const char* const fired = R"({"end": {"pkg": "a", "uid": 1, "handle": 7, "how": "fired"}})";
    const char* const unseen = R"({"end": {"pkg": "a", "uid": 1, "handle": 7, "how": "unseen"}})";
    const struct {
        const char* what;
        std::vector<Record> records;
        std::vector<std::string> uses;
    } kCases[] = {
            {"levels are counted, and an off of nothing means nothing",
             {off(1, "a"), on(2, "a"), on(3, "a"), off(4, "a"), off(5, "a"), off(6, "a"),
              on(7, "a"), at(9, Kind::kTick)},
             {"a 2-5 off 2 0/0", "a 7-9 on 1 0/0"}},
            {"uids are clients of their own, but without notes names are",
             {on(1, "a", a), on(2, "a", b), off(3, "a", b), off(4, "a", a), off(5, "a")},
             {"a 2-3 off 1 0/0", "a 1-4 off 1 0/0"}},
            {"an end that no call tells leaves nothing on, so that the off means nothing",
             {on(1, "a", a), on(1, "a", a), note(2, fired), off(3, "a", a), on(4, "a", a),
              note(5, unseen), note(6, unseen)},
             {"a 1-2 fired 2 0/0", "a 4-5 unseen 1 0/0"}},
            {"nothing is held after what is known, and the display counts where it is known",
             {note(0, kDayCapture), displayIs(2, true),
              on(4, "a", R"({"handle": 7, "before": true})"), displayIs(6, false),
              displayIs(22, true), on(28, "b"), on(31, "c"), off(32, "a")},
             {"a before 4-30 on 1 16/10", "b 28-30 on 1 2/2"}},
            {"what is on when a capture is taken may be known for longer than the trace lasts",
             {note(0, kDayCapture), on(4, "a"), note(9, R"({"taken": {}})")},
             {"a 4-30 on 1 0/0"}},
            {"a trace that stops before does not tell",
             {note(0, kDayCapture), on(4, "a"), at(9, Kind::kTick)},
             {"a 4-9 on 1 0/0"}},
            {"a capture's clock ends with its boot, and so does what is known of the display",
             {note(0, kDayCapture), displayIs(1, true), on(4, "a"), at(5, Kind::kBoot), on(40, "a"),
              off(41, "a")},
             {"a 4-4 on 1 0/0", "a 40-41 off 1 0/0"}},
    };
    for (const auto& [what, records, expected] : kCases) {
        const day::Journal journal = gather(records);
        std::vector<std::string> uses;
        for (const day::Use& use : journal.uses) uses.push_back(show(use));
        EXPECT_EQ(uses, expected) << what;
    }
}

TEST(DayTest, AUseKnowsItsSensorItsShortestPeriodAndItsSamples) {
    const char* const sensors = R"({"sensors": [
            {"handle": 7, "name": "Acc", "type": 1, "mode": "continuous", "maxRate": 100},
            {"handle": 8, "name": "Motion", "type": 17, "mode": "one-shot", "maxRate": 100}],
            "packages": [{"uid": 1, "names": ["com.a"]}]})";
    const day::Journal journal = gather({
            note(0, sensors),
            on(0, "a", R"({"handle": 7, "uid": 1, "batchUs": -1})", 40'000'000),
            on(1, "a", R"({"handle": 7, "uid": 1, "batchUs": 50})", 20'000'000),
            on(1, "a", R"({"handle": 7, "uid": 1, "rateKnown": false})", 1'000'000),
            on(0, "fast", R"({"handle": 7})", 0),
            on(0, "once", R"({"handle": 8})", 0, 17),
            on(0, "guess", R"({"handle": 7, "rateKnown": false})", 0),
            at(10, Kind::kTick),
    });
    ASSERT_EQ(journal.uses.size(), 4u);
    const day::Use& use = journal.uses[0];
    EXPECT_EQ(use.sensor, "Acc");
    EXPECT_EQ(use.packages, std::vector<std::string>{"com.a"});
    EXPECT_EQ(use.periodNs, 20'000'000);
    EXPECT_EQ(use.batchUs, 50);
    const std::optional<double> kSamples[] = {500, 1000, std::nullopt, std::nullopt};
    for (const day::Use& each : journal.uses) {
        const size_t i = &each - journal.uses.data();
        EXPECT_EQ(samplesOf(each), kSamples[each.pkg == "fast" ? 1 : i == 0 ? 0 : 2]) << each.pkg;
    }
}

/** So many apps, one after another, each a second longer than the one before; and their report. */
std::vector<Record> manyApps(int count) {
    static std::vector<std::string> names;
    if (names.empty()) names.resize(100);
    std::vector<Record> records;
    int64_t now = 0;
    for (int i = 0; i < count; ++i) {
        names[i] = "app" + std::to_string(i);
        records.push_back(on(now, names[i]));
        records.push_back(off(now += i + 1, names[i]));
    }
    records.push_back(at(now, Kind::kTick, {}, 23));
    return records;
}

TEST(DayTest, EachUseThatEarnsNoReportHasItsCause) {
    using day::Cause;
    const Record report = at(50, Kind::kTick, {}, 23);
    const Record reset = at(60, Kind::kReset, {"SDCImpl.notifySdcReset"}, 23);
    const Record later = at(90, Kind::kTick, {}, 23);
    const char* const handle = R"({"handle": 1})";
    const char* const other = R"({"handle": 2})";
    const char* const died = R"({"end": {"pkg": "a", "handle": 1, "how": "unseen"}})";
    const struct {
        std::vector<Record> records;
        std::vector<std::pair<Cause, size_t>> causes;  // and how many uses each concerns
    } kCases[] = {
            {{on(1, "a"), off(9, "a"), report}, {}},
            {{on(1, "a"), off(9, "a"), at(50, Kind::kTick, {}, 22)}, {{Cause::kNoReport, 1}}},
            {{on(1, "a"), report, off(51, "a")}, {{Cause::kStillOn, 1}}},
            {{on(1, "a"), report}, {{Cause::kStillOn, 1}}},
            {{on(1, "a"), on(2, "b", {}, 500), off(9, "a"), off(9, "b"), report},
             {{Cause::kSlower, 1}}},
            {{on(1, "a"), on(2, "b"), off(9, "a"), off(9, "b"), report}, {{Cause::kSameRate, 2}}},
            {{on(1, "a"), off(9, "a"), on(9, "b"), off(10, "b"), report}, {}},
            {{on(1, "a", {}, 0, 8), off(1801, "a", {}, 8)}, {{Cause::kShortProximity, 1}}},
            {{on(1, "a", {}, 0, 8), off(1802, "a", {}, 8)}, {}},
            {{on(1, "a", {}, 0, 8), off(999, "a", {}, 8), on(999, "b", {}, 0, 8),
              on(1999, "b", {}, 0, 8), off(2001, "b", {}, 8), off(2900, "b", {}, 8)},
             {{Cause::kShortProximity, 1}}},
            {{on(1, "a", {}, 0, 8), off(999, "a", {}, 8), on(999, "a", {}, 0, 8),
              off(2001, "a", {}, 8)},
             {{Cause::kShortProximity, 2}}},
            {{on(1, "a", {}, 0, 8), report}, {{Cause::kOpenProximity, 1}}},
            {{on(1, "com.zuno.a", {}, 0, 8), off(3000, "com.zuno.a", {}, 8)},
             {{Cause::kSystemApp, 1}}},
            {{on(1, "a", {}, 0, 5), on(1, "b", {}, 0, 6), report}, {{Cause::kNobodyWatches, 2}}},
            {{on(1, "a", handle), note(5, died), on(7, "a", handle), off(9, "a", handle), report},
             {{Cause::kUnseenEnd, 2}}},
            {{on(1, "a"), off(1, "a"), report}, {{Cause::kTooShort, 1}}},
            {{report, on(51, "a"), off(55, "a"), reset}, {{Cause::kWiped, 1}}},
            {{on(1, "a"), report, off(51, "a"), reset}, {{Cause::kStillOn, 1}}},
            {{on(1, "a"), off(9, "a"), on(11, "a", {}, 500), off(20, "a"), report},
             {{Cause::kFirstRate, 1}}},
            {{on(1, "a", {}, 500), report, reset, off(70, "a"), on(71, "b"), off(80, "b"), later},
             {{Cause::kStillOn, 1}, {Cause::kStaleRate, 1}}},
            {{on(1, "a", {}, 500), report, reset, off(60, "a"), on(71, "b"), off(80, "b"), later},
             {{Cause::kStillOn, 1}, {Cause::kStaleRate, 1}}},
            {{on(1, "a", handle), on(2, "a", other), off(9, "a", handle), off(10, "a", other),
              report},
             {{Cause::kTogether, 2}}},
            {manyApps(51), {{Cause::kBeyondList, 1}}},
    };
    for (const auto& [records, expected] : kCases) {
        const day::Journal journal = gather(records);
        std::vector<std::pair<Cause, size_t>> causes;
        for (const auto& [cause, uses] : journal.causes()) causes.emplace_back(cause, uses.size());
        EXPECT_EQ(causes, expected);
    }
}

TEST(DayTest, WhatEndsInAGapMayHaveBeenSwitchedOffThere) {
    const auto findings = [](const std::string& gap) {
        size_t deaths = 0;
        const day::Journal journal = gather(
                {note(0, R"({"capture": {"files": ["a"], "registrations": 1, "from": 0, "to": 1, )"
                         R"("knownTo": 90000}, "gaps": [)" +
                                 gap + "]}"),
                 on(1, "a", R"({"handle": 1})"),
                 note(50, R"({"end": {"pkg": "a", "handle": 1, "how": "unseen"}})"), at(99, {})});
        for (const day::Finding& finding : day::findFindings(journal)) {
            deaths += finding.kind == day::Finding::Kind::kDied ? 1 : 0;
        }
        return deaths;
    };
    EXPECT_EQ(findings(R"({"from": 40000, "to": 49999})"), 1u);
    EXPECT_EQ(findings(R"({"from": 40000, "to": 50000})"), 0u);
    for (const int hour : {3599, 3600}) {
        const auto dark = gather({displayIs(0, false), on(0, "a"), off(hour, "a")});
        EXPECT_EQ(day::findFindings(dark).size(), hour / 3600u);
    }
}

TEST(DayTest, ATableSplitsUsesAtMidnightAndKeepsSensorsOfOneTypeApart) {
    const char* const first = R"({"handle": 1})";
    const char* const second = R"({"handle": 2})";
    const day::Journal journal = gather({
            displayIs(86'400 - 10, true),
            on(86'400 - 20, "a", first),
            on(86'400 - 5, "a", second),
            off(86'400 + 5, "a", second),
            off(86'400 + 30, "a", first),
    });
    std::string shown;
    for (const day::Day& day : journal.days()) {
        for (const day::DayRow& row : journal.table.rowsOf(day)) {
            shown += std::to_string(day.number) + ": " + std::to_string(row.held / kSecond) + ' ' +
                     std::to_string(row.display.known / kSecond) + ' ' +
                     std::to_string(row.enables) +
                     (row.state == day::DayRow::State::kOn ? " open\n" : "\n");
        }
    }
    EXPECT_EQ(shown, "0: 20 10 1 open\n0: 5 5 1 open\n1: 30 30 0\n1: 5 5 0\n");
    EXPECT_EQ(journal.played(), kDay + 30 * kSecond);
}

TEST(DayTest, WhatIsSeenAndHeldOnBatteryIsCountedOnce) {
    day::JournalWriter writer;
    writer.begin("input");
    writer.take(at(0, Kind::kBoot));
    writer.take(note(0, R"({"capture": {"files": ["f"], "registrations": 1, "from": 0, "to": 90000,
        "knownTo": 100000, "bound": "stamp"}, "gaps": [{"from": 10000, "to": 20000}],
        "sensors": [{"handle": 1, "name": "A", "type": 1}], "taken": {"sinceCharge":
        {"onBatteryMs": 9000, "rows": [{"uid": 5, "handle": 1, "ms": 1, "count": 1},
        {"uid": 5, "handle": 7, "ms": 2, "count": 1}, {"uid": 5, "handle": -10000, "ms": 3,
        "count": 1}]}}})"));
    writer.take(displayIs(5, false));
    writer.take({Kind::kOver, 40 * kSecond});
    writer.take(at(40, Kind::kBoot, {}, 0, static_cast<int32_t>(trace::BootKind::kProcess)));
    writer.take({Kind::kOver, 50 * kSecond});
    const day::Profile profile = profileOf(writer.end());
    EXPECT_EQ(profile.covered, 90 * kSecond) << "40 and 60 but for the gap";
    EXPECT_EQ(profile.display.off(), 25 * kSecond) << "the second process was told nothing";
    std::string rows;
    for (const auto& [key, row] : profile.rows) {
        rows += std::to_string(key.uid.value_or(0)) + ' ' +
                (key.type ? std::to_string(*key.type) : "none") + ' ' + row.sensor + ' ' +
                std::to_string(row.heldOnBattery / 1'000'000) + '\n';
    }
    EXPECT_EQ(rows, "5 none GPS 3\n5 0  2\n5 1 A 1\n");
}

TEST(DayTest, APageShowsOnEachDayItsPartOfAUse) {
    const day::Journal journal =
            gather({note(0, R"({"capture": {"knownTo": 400000000}})"),
                    on(3600, "a", R"({"handle": 1, "before": true})", 20'000'000),
                    off(2 * 86'400 + 7200, "a", R"({"handle": 1})")});
    report::page::Day last = report::pageDay(journal, {0, 2});
    const report::page::Use first = report::pageDay(journal, {0, 0}).lanes.at(0).uses.at(0);
    EXPECT_EQ(first.facts, "before 01:00:00 to 02:00:00, 2 days later, 49:00:00, 50.0 Hz");
    EXPECT_TRUE(first.isBefore);
    EXPECT_FALSE(last.lanes.at(0).uses.at(0).isBefore);
    EXPECT_EQ(report::page::hoursOf({last}).to, kDay / 8) << "2 o'clock is shown";
    last.lanes[0].uses.resize(10);
    EXPECT_EQ(report::page::drawDay(last, {0, kDay}).find(" more"), std::string::npos);
}

TEST(DayTest, WhatIsRoundedAwayInAComparisonHasNoSignAndNoRange) {
    const auto heldFor = [](int64_t seconds, const char* more) {
        const std::string known = R"({"capture": {"knownTo": 36000000}, "sensors": [
                {"handle": 1, "name": "A", "type": 1, "maxRate": 1}, {"handle": 2, "name": ")" +
                                  std::string(more) + R"(", "type": 1, "maxRate": 2}]})";
        const std::string tag = std::string("a$") + (*more == 'A' ? "1" : "23");
        return gather({note(0, known), on(0, tag), off(seconds, tag), at(36'000, Kind::kTick)});
    };
    for (const auto& [seconds, size] :
         {std::pair(24, "0:00:00"), {26, "+0:00:01"}, {16, "0:00:00"}, {14, "-0:00:01"}}) {
        report::ComparedSides sides(2);
        for (const int64_t each : {19, 21}) sides.add(heldFor(each, "A"));
        sides.add(heldFor(seconds, "B"));
        const report::Section compared = *sides.layOut(9);
        ASSERT_EQ(compared.parts.size(), 2u);
        EXPECT_EQ(compared.parts[1].tables[0].table.rows().size(), 1u)
                << "B is new, the first A stays";
        const auto& row = compared.parts.at(0).tables.at(0).table.rows().at(0);
        EXPECT_EQ(row, (std::vector<std::string>{"a", "accelerometer", "0:00:02", row[3], size,
                                                 "hour", row[6]}));
    }
}

TEST(DayTest, APayloadIsTakenApartWhateverItsNamesHold) {
    const struct {
        const char* id;
        const char* payload;
        const char* json;
        const char* meaning;
    } kCases[] = {
            {"N273|10009", "count:3", R"({"count": "3"})", "screen samples of the day"},
            {"N273|10006", "reason:2147483646", R"({"reason": "2147483646"})", "light: exceptions"},
            {"N273|10010", "pkg:a&time:9/b:c&time:1801",
             R"({"pkg": "a&time:9/b:c", "time": "1801"})", "long use of the proximity sensor"},
            {"N273|10011", "TempInvalidRate:1/2&pkg:&x:&ultraEnergy:-1/0&ultraExpired:102",
             R"({"TempInvalidRate": "1/2", "pkg": "&x:", "ultraEnergy": "-1/0", )"
             R"("ultraExpired": "102"})",
             "ultrasonic proximity"},
            {"N273|10012",
             "days:1&fastChargeTime:2&otherChargeTime:3&pkg:p&shockAndChargeTime:x"
             "&shockAndChargeTime:4&totalTime:5&usbChargeTime:6",
             R"({"days": "1", "fastChargeTime": "2", "otherChargeTime": "3", )"
             R"("pkg": "p&shockAndChargeTime:x", "shockAndChargeTime": "4", "totalTime": "5", )"
             R"("usbChargeTime": "6"})",
             "orientation: totals since ever"},
            {"N273|10003",
             "app_list:{\t\"list\" : \t[\t{ \"pkg\" : \"\\\"<&\\u00e4\", \"time\" : \"7\" } ] }",
             R"({"app_list": [{"pkg": "\"<&\u00e4", "time": "7"}]})", "accelerometer: who used it"},
            {"N273|10013", "invalid:1&status:{ \"lock\" : \"7\", \"near\" : \"12\" }&total:3",
             R"({"invalid": "1", "status": {"lock": "7", "near": "12"}, "total": "3"})",
             "chat calls of the day"},
            {"N273|10013", "variance:nan/0.5/inf", R"({"variance": "nan/0.5/inf"})",
             "chat call: proximity locked up"},
            {"N273|10013", "status:{ broken", R"({"status": "{ broken"})", ""},
            {"N273|10012", "info:{\"list\" : 3}", R"({"info": {}})", "orientation: who used it"},
            {"X|1", "a:b:c&d&:e&f:", R"({"a": "b:c", "d": "", "": "e", "f": ""})", ""},
            {"N273|10009", "", "{}", ""},
    };
    for (const auto& [id, payload, json, meaning] : kCases) {
        const day::Payload taken = day::takeApart(id, payload);
        std::string written;
        base::JsonWriter writer(&written);
        report::writeFields(taken.fields, &writer);
        EXPECT_EQ(written, json);
        EXPECT_EQ(report::describe(taken.kind), meaning) << payload;
    }
}

TEST(EventTextTest, AValueIsShownAsItsKindAndAsItIsIfItIsNoNumber) {
    constexpr char kId[] = "N273|10010";
    for (const auto& [seconds, shown] :
         {std::pair("1801", "0:30:01"), {"-5", "-5"}, {"12x", "12x"}, {"", ""}, {"0", "0:00:00"}}) {
        const std::string payload = std::string("pkg:a/a&time:") + seconds;
        const report::Section text =
                report::layOutEvent({0, 0, kId, day::takeApart(kId, payload), false}, 1);
        ASSERT_EQ(text.lists.size(), 1u);
        EXPECT_EQ(text.lists[0].items,
                  (std::vector<std::string>{"app: a", std::string("held: ") + shown}));
    }
}

}  // namespace
