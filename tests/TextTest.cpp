#include "report/Text.h"

#include <gtest/gtest.h>

#include "base/Calendar.h"
#include "report/DayRows.h"
#include "report/Format.h"
#include "report/Names.h"
#include "report/Table.h"

namespace report {
namespace {

TEST(TextTest, NamesFromOutsideBecomePlainTextOfAKnownWidth) {
    const struct {
        const char* text;
        const char* safe;
        size_t width;
    } kCases[] = {
            {"a b", "a b", 3},
            {"tab\tbell\a\x1b[31m\x7f", "tab?bell??[31m?", 15},
            {"\xff"
             "a\xc3",
             "\uFFFD"
             "a\uFFFD",
             3},
            {"\u202e"
             "abc\u2066\u200f",
             "?abc??", 6},  // turn the direction of writing
            {"\u0085\u2028", "??", 2},
            {"\u05d0\u05d1", "\u05d0\u05d1", 2},
            {"\U0001F600", "\U0001F600", 2},
            {"e\u0301", "e\u0301", 1},
    };
    for (const auto& [text, expected, columns] : kCases) {
        EXPECT_EQ(safe(text), expected) << text;
        EXPECT_EQ(width(safe(text)), columns) << text;
    }
    EXPECT_EQ(safe(std::string_view("a\0b", 3)), "a?b");
}

TEST(TextTest, ALongTextLosesItsMiddleAndStaysWithinItsColumns) {
    EXPECT_EQ(cut("abcdefgh", 8), "abcdefgh");
    EXPECT_EQ(cut("abcdefgh", 7), "abc\u2026fgh");
    EXPECT_EQ(cut("abcdefgh", 4), "a\u2026gh");
    EXPECT_EQ(cut("abcdefgh", 1), "\u2026");
    EXPECT_EQ(cut("abcdefgh", 0), "");
    std::string faces;
    for (int i = 0; i < 255; ++i) faces += "\U0001F600";
    for (size_t columns = 0; columns < 30; ++columns) {
        const size_t kept = width(cut(faces, columns));
        EXPECT_LE(kept, columns);
        EXPECT_GE(kept + 2, columns);
    }
}

TEST(TextTest, TimesRatesAndDaysAreWrittenForAPerson) {
    constexpr int64_t kSecond = 1'000'000'000;
    EXPECT_EQ(base::formatDuration(std::chrono::nanoseconds(0)), "0:00:00");
    EXPECT_EQ(base::formatDuration(std::chrono::nanoseconds(3600 * kSecond - 1)), "0:59:59");
    EXPECT_EQ(base::formatDuration(
                      std::chrono::nanoseconds(int64_t{100} * 3600 * kSecond + 61 * kSecond)),
              "100:01:01");
    EXPECT_EQ(base::formatTimeOfDay(
                      std::chrono::nanoseconds(int64_t{25} * 3600 * kSecond + 62 * kSecond)),
              "01:01:02");
    EXPECT_EQ(base::formatDate(0), "1970-01-01");
    EXPECT_EQ(base::formatDate(19'782), "2024-02-29");
    EXPECT_EQ(formatRate(66'667'000), "15.0");
    EXPECT_EQ(formatRate(5'000'000'000), "0.2");
    EXPECT_EQ(formatRate(10'000), "100000.0");
    EXPECT_EQ(formatRate(1000), "1e+06");
    EXPECT_EQ(formatRate(0), "fastest");
    EXPECT_EQ(formatRate(-1), "fastest");
    EXPECT_EQ(formatSamples(9999.4), "9999");
    EXPECT_EQ(formatSamples(9999.5), "10.0k") << "as the page's script has it";
    EXPECT_EQ(formatClock(86'399'999'999'999), "day 1 23:59:59.999999999");
    EXPECT_EQ(formatClock(86'461'001'000'000), "day 2 00:01:01.001");
    EXPECT_EQ(onOneLine(" \t a\n\x7f  b"), " a?? b");
    const std::string letters = "?VDIWEFS?";
    for (int level = 1; level < 10; ++level) EXPECT_EQ(levelLetter(level), letters[level - 1]);
    EXPECT_EQ(levelLetter(-1), '?');
}

TEST(TextTest, AnAppIsNamedByItsPackageAndATimeMarkedByWhatIsNotKnownOfIt) {
    day::DayRow row;
    row.holder.pkg = "com.ab";
    row.holder.packages = {"com.a", "com.b"};
    row.isBefore = row.isUnseen = true;
    EXPECT_EQ(nameApp(row.holder), "com.a +1 (com.ab)");
    EXPECT_EQ(formatHeld(row), "~0:00:00");
}

TEST(TextTest, ATableFitsItsRoomByCuttingTheWidestNamesFirst) {
    Table table({{"A", Table::Column::kCut},
                 {"B", Table::Column::kCut},
                 {"N", Table::Column::kRight},
                 {"M", Table::Column::kRight},
                 {"empty"}},
                2);
    const std::string a(120, 'a');
    const std::string half(30, 'a');
    table.add({a, std::string(30, 'b'), "1", "", ""});
    table.add({"<x>", "\"&'", "234", "5 s", ""});
    table.add({"left", "out", "0", "", ""});
    const std::string more = "  and 1 more (--all shows them)\n";
    EXPECT_EQ(table.text(2, 105), "  A" + std::string(60, ' ') + "  B" + std::string(29, ' ') +
                                          "    N    M\n  " + half + "\u2026" + half + "  " +
                                          std::string(30, 'b') + "    1\n  <x>" +
                                          std::string(58, ' ') + "  \"&'" + std::string(27, ' ') +
                                          "  234  5 s\n" + more);
    EXPECT_EQ(table.text(2, 29),
              "  A             B\n      N    M\n  aaaaa\u2026aaaaaa  bbbbbb\u2026bbbbbb\n      1\n"
              "  <x>           \"&'\n    234  5 s\n" +
                      more)
            << "names on a line of their own";
    EXPECT_EQ(table.text(2).find("\u2026"), std::string::npos) << "without a width nothing is cut";
    EXPECT_EQ(table.text(2, 8).substr(0, 23), "  A   B\n      N\n      M") << "as many as it needs";
}

TEST(TextTest, ASentenceIsBrokenAtItsBlanks) {
    const std::pair<std::string, std::vector<std::string>> kCases[] = {
            {"", {""}},
            {"one two", {"one two"}},
            {"one two three", {"one two", "three"}},
            {"one twothreefour 5", {"one", "two\u2026our", "5"}},
            {"\u4e00\u4e8c\u4e09\u56db", {"\u4e00\u2026\u56db"}},
    };
    for (const auto& [text, lines] : kCases) EXPECT_EQ(wrap(text, 7), lines) << text;
}

}  // namespace
}  // namespace report
