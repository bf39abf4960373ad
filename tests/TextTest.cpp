#include "report/Text.h"

#include <gtest/gtest.h>

#include "report/Format.h"
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
    EXPECT_EQ(formatDuration(0), "0:00:00");
    EXPECT_EQ(formatDuration(3600 * kSecond - 1), "0:59:59");
    EXPECT_EQ(formatDuration(int64_t{100} * 3600 * kSecond + 61 * kSecond), "100:01:01");
    EXPECT_EQ(formatTimeOfDay(int64_t{25} * 3600 * kSecond + 62 * kSecond), "01:01:02");
    EXPECT_EQ(formatDate(0), "1970-01-01");
    EXPECT_EQ(formatDate(19'782), "2024-02-29");
    EXPECT_EQ(formatRate(66'667'000), "15.0");
    EXPECT_EQ(formatRate(5'000'000'000), "0.2");
    EXPECT_EQ(formatRate(10'000), "100000.0");
    EXPECT_EQ(formatRate(1000), "1e+06");
    EXPECT_EQ(formatRate(0), "fastest");
    EXPECT_EQ(formatRate(-1), "fastest");
    EXPECT_EQ(formatClock(86'399'999'999'999), "day 1 23:59:59.999999999");
    EXPECT_EQ(formatClock(86'461'001'000'000), "day 2 00:01:01.001");
    EXPECT_EQ(printable(" \t a\n\x7f  b"), " a?? b");
    const std::string letters = "?VDIWEFS?";
    for (int level = 1; level < 10; ++level) EXPECT_EQ(levelLetter(level), letters[level - 1]);
    EXPECT_EQ(levelLetter(-1), '?');
}

TEST(TextTest, ATableFitsItsWidthByCuttingTheWidestNamesFirst) {
    Table table(
            {{"A", Table::Column::kCut}, {"B", Table::Column::kCut}, {"N", Table::Column::kRight}},
            2);
    table.add({std::string(120, 'a'), std::string(30, 'b'), "1"});
    table.add({"<x>", "\"&'", "234"});
    table.add({"left", "out", "0"});
    std::string expected = "  A" + std::string(60, ' ') + "  B" + std::string(29, ' ') + "    N\n";
    expected += "  " + std::string(30, 'a') + "\u2026" + std::string(30, 'a') + "  " +
                std::string(30, 'b') + "    1\n";
    expected += "  <x>" + std::string(58, ' ') + "  \"&'" + std::string(27, ' ') + "  234\n";
    expected += "  and 1 more (--all shows them)\n";
    EXPECT_EQ(table.text(2), expected);
    const std::string html = table.html();
    EXPECT_NE(html.find("<td>&lt;x&gt;</td><td>&quot;&amp;&#39;</td><td class=\"number\">234</td>"),
              std::string::npos)
            << html;
    EXPECT_NE(html.find("<p>and 1 more</p>"), std::string::npos);

    Table wide(std::vector<Table::Column>(12, {"A", Table::Column::kCut}), 1);
    wide.add(std::vector<std::string>(12, std::string(30, 'a')));
    const std::string text = wide.text(0);
    EXPECT_EQ(width(text.substr(text.find('\n') + 1)), 12 * 10 + 11 * 2u) << "10 of each are kept";
}

}  // namespace
}  // namespace report
