#include "capture/dump/WallTime.h"

#include <optional>
#include <string>

#include <gtest/gtest.h>

#include "base/Calendar.h"

namespace {

using base::formatStamp;
using capture::parseStamp;

TEST(WallTimeTest, ReadsMomentsThatExist) {
    EXPECT_EQ(parseStamp("1970-01-01 00:00:00"), 0);
    EXPECT_EQ(parseStamp("2024-02-29 12:34:56 and more"), 1'709'210'096'000);
    EXPECT_EQ(parseStamp("2000-03-01 00:00:00"), 951'868'800'000);
    EXPECT_EQ(parseStamp("1969-12-31 23:59:59"), -1000);
    for (const char* text :
         {"2023-02-29 00:00:00", "1900-02-29 00:00:00", "2024-00-01 00:00:00",
          "2024-13-01 00:00:00", "2024-04-31 00:00:00", "2024-04-00 00:00:00",
          "2024-04-01 24:00:00", "2024-04-01 00:60:00", "2024-04-01 00:00:60", "2024-04-01 00:00:0",
          "2024-04-01T00:00:00", "0000-01-01 00:00:00", ""}) {
        EXPECT_EQ(parseStamp(text), std::nullopt) << text;
    }
    EXPECT_EQ(capture::parseDashedStamp("2024-02-29-12-34-56"), 1'709'210'096'000);
    EXPECT_EQ(capture::parseDashedStamp("2024-02-29-12-34-56 "), std::nullopt);
    EXPECT_EQ(capture::parseTimeOfDay("23:59:59 x"), 86'399'000);
    EXPECT_EQ(capture::parseTimeOfDay("24:00:00 x"), std::nullopt);
    EXPECT_EQ(capture::parseTimeOfDay("23:59:59"), std::nullopt);
}

TEST(WallTimeTest, PrintsWhatItReads) {
    for (int64_t day = -719'162; day < 2'932'000; day += 61) {
        const int64_t time = day * capture::kMsPerDay + 45'296'000;
        EXPECT_EQ(parseStamp(formatStamp(time)), time);
    }
    EXPECT_EQ(formatStamp(-1), "1969-12-31 23:59:59");
    EXPECT_EQ(base::formatTimeOfDay(std::chrono::milliseconds(86'400'000 + 3'723'999)), "01:02:03");
}

TEST(WallTimeTest, GivesALogLineTheYearInWhichItLies) {
    struct Case {
        const char* stamp;
        const char* taken;
        const char* expected;  // empty: there is no such moment
    };
    for (const auto& [stamp, taken, expected] : {
                 Case{"04-25 11:45:07.999", "2018-04-25 11:45:07", "2018-04-25 11:45:07"},
                 Case{"01-22 10:48:57.939", "2018-04-25 11:45:07", "2018-01-22 10:48:57"},
                 Case{"04-26 11:45:07.000", "2018-04-25 11:45:07", "2018-04-26 11:45:07"},
                 Case{"04-26 11:45:07.001", "2018-04-25 11:45:07", "2017-04-26 11:45:07"},
                 Case{"12-31 23:00:00.000", "2018-01-01 00:00:01", "2017-12-31 23:00:00"},
                 Case{"02-29 01:00:00.000", "2020-02-29 02:00:00", "2020-02-29 01:00:00"},
                 Case{"02-29 01:00:00.000", "2021-01-01 02:00:00", "2020-02-29 01:00:00"},
                 Case{"02-29 01:00:00.000", "2020-01-01 02:00:00", ""},
                 Case{"02-29 01:00:00.000", "2022-05-01 02:00:00", ""},
         }) {
        const auto time = capture::parseYearlessStamp(stamp);
        ASSERT_TRUE(time) << stamp;
        const auto dated = capture::withYear(*time, *parseStamp(taken));
        EXPECT_EQ(dated ? formatStamp(*dated) : "", expected) << stamp << " of " << taken;
    }
    for (const char* text : {"02-30 00:00:00.000", "00-01 00:00:00.000", "01-01 24:00:00.000",
                             "01-01 00:00:00", "1-01 00:00:00.000"}) {
        EXPECT_EQ(capture::parseYearlessStamp(text), std::nullopt) << text;
    }
}

}  // namespace
