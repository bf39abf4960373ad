#include "capture/DumpJoin.h"

#include <algorithm>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "capture/text/CaptureText.h"
#include "tests/Captures.h"

namespace {

using capture::DumpJoin;

/** Each letter is a registration. */
std::vector<capture::Registration> lines(const std::string& letters) {
    std::vector<capture::Registration> lines;
    for (const char letter : letters) {
        capture::Registration line{};
        line.package = letter;
        lines.push_back(line);
    }
    return lines;
}

/** Dumps as letters, oldest first. The joined ones, with " " at gaps, ": " and their order. */
std::string join(const std::vector<std::string>& dumps, const std::vector<int64_t>& taken = {}) {
    DumpJoin join;
    for (size_t i = 0; i < dumps.size(); ++i) {
        join.add(lines(dumps[i]), taken.empty() ? std::nullopt : std::optional(taken[i]));
    }
    const capture::JoinedLines joined = join.finish();
    if (const auto& apart = joined.unordered) {
        return std::to_string(apart->first) + " and " + std::to_string(apart->second);
    }
    std::string text;
    for (size_t i = 0; i < joined.lines.size(); ++i) {
        const auto& gaps = joined.gaps;
        if (std::find(gaps.begin(), gaps.end(), i) != gaps.end()) text += ' ';
        text += joined.lines[i].registration.package;
    }
    text += ":";
    for (const auto& dump : joined.dumps) text += " " + std::to_string(dump.dump);
    return text;
}

TEST(DumpJoinTest, JoinsAtTheLongestRunThatEndsTheOlderAndBeginsTheNewer) {
    struct Case {
        std::vector<std::string> dumps;
        const char* joined;
    };
    for (const auto& [dumps, joined] : std::vector<Case>{
                 {{"abc"}, "abc: 0"},
                 {{"abcd", "cdef"}, "abcdef: 0 1"},
                 {{"cdef", "abcd"}, "abcdef: 1 0"},
                 {{"abcd", "abcd"}, "abcd: 0 1"},
                 {{"abab", "abac"}, "ababac: 0 1"},
                 {{"aaa", "aab"}, "aaab: 0 1"},
                 {{"bcd", "abcde"}, "abcde: 0 1"},
                 {{"abcde", "bcd"}, "abcde: 1 0"},
                 {{"abcde", "de"}, "abcde: 0 1"},
                 {{"de", "abc", "bcd"}, "abcde: 1 2 0"},
                 {{"abc", "xyz"}, "1 and 0"},
                 {{"xyz", "abc", "cd"}, "1 and 0"},
                 {{"a", "b", "ab"}, "ab: 0 1 2"},
                 {{"xbcab", "bca"}, "xbcab: 1 0"},
                 {{"ababa", "aba"}, "ababa: 0 1"},
                 {{"ab", "ba"}, "aba: 0 1"},
         }) {
        EXPECT_EQ(join(dumps), joined);
    }
    EXPECT_EQ(join({"xyz", "abc", "cd"}, {3, 1, 2}), "abcd xyz: 1 2 0");
    EXPECT_EQ(join({"ab", "ab", "ab"}, {3, 1, 2}), "ab: 1 2 0");
}

TEST(DumpJoinTest, GivesALongCaptureAgainFromPiecesInAnyOrder) {
    std::string all;
    for (int i = 0; i < 200; ++i) all += static_cast<char>('A' + i % 7 * 5 + i / 50 + (i * i) % 11);
    std::vector<std::string> pieces;
    for (size_t begin = 0; begin < all.size(); begin += 23) pieces.push_back(all.substr(begin, 40));
    for (int turn = 0; turn < 20; ++turn) {
        std::rotate(pieces.begin(), pieces.begin() + 5, pieces.end());
        std::swap(pieces[0], pieces[static_cast<size_t>(turn) % pieces.size()]);
        EXPECT_EQ(join(pieces).substr(0, all.size() + 1), all + ":");
    }
}

/** A report taken at `taken`, with registrations off at `times`, newest first. */
std::string dump(const std::string& taken, const std::vector<std::string>& times,
                 const std::string& history = "") {
    std::string text = bugReport(history, "");
    const size_t line = text.find("10:00:00 -");
    const std::string rest = text.substr(line + 8, text.find('\n', line) + 1 - line - 8);
    std::string lines;
    for (const std::string& time : times) lines += time + rest;
    text.replace(line, 8 + rest.size(), lines);
    for (const char* stamp : {"2024-05-02 11:59:00", "2024-05-02 12:00:00"}) {
        text.replace(text.find(stamp), 19, taken);
    }
    return text;
}

TEST(DumpJoinTest, NamesAGapWithItsTimes) {
    const auto dated = importTexts({dump("2024-05-04 12:00:00", {"10:00:00"}),
                                    dump("2024-05-02 12:00:00", {"11:00:00", "09:00:00"})});
    EXPECT_EQ(dated.warnings,
              std::vector<std::string>{"0:13: warning: registrations are missing from 2024-05-02 "
                                       "11:00:00 to 2024-05-04 10:00:00"});
    const trace::Note note = noteWith("\"capture\"", dated.trace);
    ASSERT_EQ(note.gaps.size(), 1u);
    EXPECT_EQ(note.gaps[0].from, 39'600'000);
    EXPECT_EQ(note.gaps[0].to, 2 * 86'400'000 + 36'000'000);
    EXPECT_EQ(note.capture->files, (std::vector<std::string>{"1", "0"}));
    EXPECT_EQ(note.capture->taken, "2024-05-04 12:00:00");
    // A line is the same only if all of it is.
    const std::string list = kSensors + "Previous Registrations:\n09:00:00 + 0x00000000 pid=1 ";
    for (const char* other : {"uid=1 package=b samplingPeriod=5us batchingPeriod=0us",
                              "uid=1 package=a samplingPeriod=6us batchingPeriod=0us",
                              "uid=1 package=a samplingPeriod=5us batchingPeriod=7us"}) {
        EXPECT_EQ(importTexts({list + "uid=1 package=a samplingPeriod=5us batchingPeriod=0us\n",
                               list + other + '\n'})
                          .error,
                  "0: no registration is also in 1, and without dates the two cannot be put in "
                  "order: merge captures that say when they were taken")
                << other;
    }
}

TEST(DumpJoinTest, DatesEachDumpByItself) {
    const auto headOf = [](const Imported& imported) {
        return *noteWith("\"capture\"", imported.trace).capture;
    };
    // The line of 09:00 is of two days before the newest: the older dump says so.
    const auto imported = importTexts({dump("2024-05-02 12:00:00", {"09:00:00"}),
                                       dump("2024-05-04 12:00:00", {"10:00:00", "09:00:00"})});
    EXPECT_EQ(headOf(imported).to, 2 * 86'400'000 + 36'000'000);
    EXPECT_EQ(headOf(importText(dump("2024-05-02 12:00:00", {"12:00:00"}))).midnight, "2024-05-02");
    EXPECT_EQ(headOf(importText(dump("2024-05-02 12:00:00", {"12:00:01"}))).midnight, "2024-05-01");
    // Where two dumps could follow each other either way, their dates tell.
    const auto either = importTexts({dump("2024-05-03 12:00:00", {"09:00:00", "10:30:00"}),
                                     dump("2024-05-02 12:00:00", {"10:30:00", "09:00:00"})});
    EXPECT_EQ(headOf(either).from, 32'400'000);
    // One date alone tells nothing: they follow each other as they were given.
    std::string undated = dump("2024-05-02 12:00:00", {"10:30:00", "09:00:00"});
    for (size_t at; (at = undated.find("2024-05-02")) != std::string::npos;) undated.erase(at, 19);
    EXPECT_EQ(headOf(importTexts({dump("2024-05-03 12:00:00", {"09:00:00", "10:30:00"}), undated}))
                      .from,
              37'800'000);
    // A date that is later than the newer dump allows is wrong.
    const auto late = importTexts({dump("2024-05-04 12:00:00", {"09:00:00"}),
                                   dump("2024-05-04 12:00:00", {"07:30:00", "09:00:00"})});
    EXPECT_EQ(headOf(late).to, 86'400'000 + 27'000'000);
    EXPECT_EQ(headOf(late).midnight, "2024-05-03");
}

TEST(DumpJoinTest, TakesStatesFromEachDumpSinceTheOneBefore) {
    const std::string first =
            "0 (1) RESET:TIME: 2024-05-02-09-00-00\n0 (2) 050 plug=usb\n"
            "+1h00m00s000ms (2) 050 +screen\n";
    const std::string second =
            "0 (1) RESET:TIME: 2024-05-02-10-30-00\n0 (2) 050 plug=ac +screen\n"
            "+30m00s500ms (2) 050 plug=wireless\n+1h00m00s000ms (2) 050 -screen +camera\n";
    const auto merge = [&](const char* secondTaken, const std::string& history) {
        const auto imported = importTexts({dump("2024-05-02 11:00:00", {"09:30:00"}, first),
                                           dump(secondTaken, {"10:50:00", "09:30:00"}, history)});
        std::string known;
        const trace::Note note = noteWith("\"capture\"", imported.trace);
        for (const auto& each : note.known->display) {
            known +=
                    " " + std::to_string(each.from / 60000) + "-" + std::to_string(each.to / 60000);
        }
        return statesOf(imported.trace) + known;
    };
    const std::string start = "09:29:50 d1 p2 c0 t0, 10:00:00 d2, ";
    EXPECT_EQ(merge("2024-05-02 12:00:00", second),
              start + "11:00:00 p3, 11:30:00 d1 c1, 12:00:00 p0 c0 569-720");
    EXPECT_EQ(merge("2024-05-02 12:00:00", ""), start + "11:00:00 d1 p0 569-660");
    EXPECT_EQ(merge("2024-05-02 12:00:00", "0 (1) RESET:TIME: 2024-05-02-11-10-00\n0 (2) 050\n"),
              start + "11:00:00 d1 p0 569-660 670-720");
    const std::string restart =
            first + "+1h10m00s000ms (2) START\n+1h10m00s000ms (2) TIME: 2024-05-02-10-10-00\n";
    EXPECT_EQ(importTexts({dump("2024-05-02 11:00:00", {"09:30:00"}, restart),
                           dump("2024-05-02 11:30:00", {"09:30:00"}, restart)})
                      .warnings.size(),
              1u);
}

TEST(DumpJoinTest, EndsTheDayAfterTheLastChangeOfAState) {
    const std::string history = "0 (1) RESET:TIME: 2024-05-02-09-00-00\n0 (2) 050 plug=usb\n";
    const std::string late = importText(dump("2024-05-02 23:30:00", {"10:00:00"}, history)).trace;
    EXPECT_EQ(linesWith("", late).back(), R"({"at": 169220000})");
}

}  // namespace
