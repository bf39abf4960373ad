#include "trace/TraceLine.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "base/Json.h"
#include "base/LineReader.h"
#include "trace/CallTable.h"
#include "trace/TraceTime.h"

namespace trace {
namespace {

/** What is wrong with a line; empty if nothing is. */
std::string judge(std::string text, TraceLine* line = nullptr) {
    TraceLine ignored;
    const size_t size = text.size();
    text.resize(size + base::LineReader::kPadding);
    return TraceParser()
            .parse({text.data(), size}, "", line != nullptr ? line : &ignored)
            .value_or("");
}

std::string call(const std::string& name, const std::string& arguments) {
    return R"({"at": 7, "call": ")" + name + R"(", "args": [)" + arguments + "]}";
}

std::string rate(const std::string& number) {
    return call("SDCImpl.enableSuccess", R"(true, 1, "a", "b", )" + number);
}

TEST(TraceLineTest, ATimeHasSixDecimalsUpToTheLastMoment) {
    const std::pair<const char*, int64_t> kTimes[] = {
            {"0", 0},
            {"-0", 0},
            {"-0.000e5", 0},
            {"0.000001", 1},
            {"1e-6", 1},
            {"0.0000010", 1},
            {"1234567890123e-6", 1234567890123},
            {"1.0020e+0", 1'002'000},
            {"10.03E2", 1'003'000'000},
            {"86400000000.1234560 ", 86'400'000'000'123'456},
            {"9e12", 9'000'000'000'000'000'000},
            {"9000000000000", 9'000'000'000'000'000'000},
            {"9000000000000.000000", 9'000'000'000'000'000'000},
            {"8999999999999.999999", 8'999'999'999'999'999'999},
            {"1e-7", -1},
            {"0.0000001", -1},
            {"0.00000101", -1},
            {"-0.000001", -1},
            {"-1", -1},
            {"9000000000001", -1},
            {"9000000000000.000001", -1},
            {"9.0000000000000000001e12", -1},
            {"1.5e-99999999999999999999", -1},
            {"1e300", -1},
            {"90e12", -1},
            {"true", -1},
            {"\"1\"", -1},
            {"null", -1},
    };
    for (const auto& [text, ns] : kTimes) {
        TraceLine line;
        const std::string error = judge(std::string(R"({"args": [], "\u0061t":)") + text +
                                                R"(, "call": "SDCImpl.getInstance"})",
                                        &line);
        const char* const expected =
                ns < 0 ? R"("at" must be a number of at most six decimals, from 0 to 9e12)" : "";
        EXPECT_EQ(error, expected) << text;
        EXPECT_EQ(line.at, std::max<int64_t>(ns, 0)) << text;
    }
}

TEST(TraceLineTest, ATimeIsWrittenWithTheDecimalsThatItHas) {
    const std::pair<int64_t, const char*> kTimes[] = {
            {0, "0"},
            {1, "0.000001"},
            {10'020'000, "10.02"},
            {1'003'000'000, "1003"},
            {8'999'999'999'999'750'000, "8999999999999.75"}};
    for (const auto& [ns, text] : kTimes) EXPECT_EQ(base::formatMs(ns), text);
}

TEST(TraceLineTest, WhatIsAtALimitIsTakenAndWhatIsBeyondItIsNamed) {
    const auto hour = [](const char* text) { return call("SDCImpl.putRgbShotTally", text); };
    const auto data = [](int count) {
        std::string numbers;
        for (int i = 0; i < count; ++i) numbers += i == 0 ? "1e39" : ", -0.5";
        return call("SDCImpl.process", R"({"type": 1, "data": [)" + numbers + "]}");
    };
    const auto property = [](const std::string& name, const std::string& value) {
        return R"({"at": 7, "property": {")" + name + "\": " + value + "}}";
    };
    const std::string v(91, 'v');
    const std::string digits(40, '9');
    const std::pair<std::string, const char*> kLines[] = {
            {"[1]", "not a JSON object"},
            {R"({"at": 1} {"at": 2})", "not valid JSON"},
            {R"({"args": []})", R"("at" is missing)"},
            {R"({"at": 1, "at": 2})", R"(the key "at" twice)"},
            {R"({"at": 1, "what": 1})", R"(unknown key "what")"},
            {R"({"at": 1, "x)" + std::string(199, 'y') + "\u00e4" + R"(": 1})", "yyy\"..."},
            {R"({"at": 1, "boot": "device", "set": {}})", "more than one action"},
            {R"({"at": 1, "boot": "cold"})", R"("boot" must be)"},
            {R"({"at": 1, "call": 1})", R"("call" must be a text)"},
            {R"({"at": 1, "call": "SDCImpl.putRgbShotTally"})", "takes 1 arguments, not 0"},
            {R"({"at": 1, "call": "SDCImpl.putRgbShotTally", "args": 7})", "must be an array"},
            {R"({"args": [1], "at": 1, "call": "SDCImpl.getInstance"})",
             "takes 0 arguments, not 1"},
            {R"({"at": 1, "set": {"mLogSwitch": true}})", R"("mLogSwitch" must be an integer)"},
            {R"({"at": 1, "set": {"nothing": 1}})", R"(unknown variable "nothing")"},
            {hour("2147483647"), ""},
            {hour("2147483648"), "argument 1 of SDCImpl.putRgbShotTally must be an integer of 32"},
            {hour("7.0"), "integer of 32 bits"},
            {call("SDCImpl.enableSuccess", R"(1, 1, "a", "b", 1)"),
             "1 of SDCImpl.enableSuccess must"},
            {call("SDCImpl.enableSuccess", R"(true, 1, "a\u0000", "b", 1)"), "a text without NUL"},
            {call("SDCImpl.setNotification", "[1, true]"), "each element must be an integer of 32"},
            {hour("-2147483648"), ""},
            {hour("-2147483649"), "integer of 32 bits"},
            {rate("9223372036854775807"), ""},
            {rate("9223372036854775808"), "integer of 64 bits"},
            {rate("-9223372036854775808"), ""},
            {rate("-9223372036854775809"), "the number -9223372036854775809 is out of range"},
            {rate("18446744073709551615"), "integer of 64 bits"},
            {rate("18446744073709551616"), "the number 18446744073709551616 is out of range"},
            {rate("1.0"), "integer of 64 bits"},
            {rate("1e308"), "integer of 64 bits"},
            {rate("1e309"), "the number 1e309 is out of range"},
            {rate("-1.5E+999"), "the number -1.5E+999 is out of range"},
            {rate(digits), "9999 is out of range"},
            {rate(digits + '8'), "9999... is out of range"},
            {rate("01"), "not valid JSON"},
            {rate("-"), "not valid JSON"},
            {rate("1.e5"), "not valid JSON"},
            {R"({"at": 1, "call": "a\"1e998\\", "args": [1e999]})", "the number 1e999 is out"},
            {R"({"at": 01, "x": 1e999})", "not valid JSON"},
            {data(0), ""},
            {data(16), ""},
            {data(17), "at most 16 numbers"},
            {call("SDCImpl.process", R"({"type": 1, "data": [], "x": 1})"), "must be an event"},
            {call("SDCImpl.process", R"({"type": 1})"), R"(an event with "type" and "data")"},
            {call("SDCImpl.process", R"({"data": [], "data": []})"), R"("type" and "data")"},
            {call("SDCImpl.process", R"({"type": 1, "data": [true]})"), "must hold numbers"},
            {call("SDCImpl.process", R"({"type": 1.0, "data": []})"), R"("type" must be an integ)"},
            {call("UltraException.doAction", R"(1, {})"), ""},
            {call("UltraException.doAction", R"(1, {"packageName": "a", "phoneState": 1})"), ""},
            {call("UltraException.doAction", R"(1, {"state": 1})"), R"("state" is unknown)"},
            {call("UltraException.doAction", R"(6, {"phoneState": 1, "phoneState": 0})"),
             R"(the key "phoneState" twice)"},
            {call("RgbShotManager.getScreenPixcel", "[1, 2, 3, 4]"), ""},
            {call("RgbShotManager.getScreenPixcel", "[1, 2, 3]"), "4 integers"},
            {call("RgbShotManager.getScreenPixcel", "[1, 2, 3, 4, 5]"), "4 integers"},
            {call("SDCImpl.setNotification", "[]"), ""},
            {property("a", '"' + v + '"'), ""},
            {property("a", "\"v" + v + '"'), "at most 91 bytes"},
            {property("a", "null"), ""},
            {property("a", "1"), R"("a" must be a text or null)"},
            {property("", "null"), "needs a name"},
            {property("a", "\"\""), ""},
            {property("a\\u0000b", "\"\""), "a property's name holds a NUL"},
            {property("a", "\"\\u0000\""), "must be a text without NUL or null"},
            {R"({"at": 7, "x\u0000y": 1})", R"(unknown key "x\u0000y")"},
            {R"({"at": 7, "call": "a\u0000\u0000b"})", R"(unknown call "a\u0000\u0000b")"},
            {R"({"at": 7, "expect": {}})", R"(with "event" or "property")"},
            {R"({"at": 7, "expect": {"event": {}, "property": {}}})", R"("event" or "property")"},
            {R"({"at": 7, "expect": {"event": {"module": "", "id": "", "payload": ""}}})", ""},
            {R"({"at": 7, "expect": {"event": {"module": "", "id": "", "payload": "",)"
             R"( "fields": 1}}})",
             ""},
            {R"({"at": 7, "expect": {"property": {"name": "a"}}})", "lacks a key"},
            {R"({"at": 7, "expect": {"property": {"name": "a", "value": 1}}})",
             R"("value" must be)"},
            {R"({"at": 7, "set": {"policy": 1, "useAutoBrightness": true}})", ""},
            {R"({"at": 7, "set": {"useAutoBrightness": 1}})", "must be true or false"},
            {R"({"at": 7, "set": {}})", ""},
            {R"({"at": 7})", ""},
            {R"({"at": 7, "args": []})", R"("args" without a call)"},
    };
    for (const auto& [text, what] : kLines) {
        const std::string error = judge(text);
        EXPECT_EQ(error.empty(), *what == '\0') << text << '\n' << error;
        EXPECT_NE(error.find(what), std::string::npos) << text << '\n' << error;
    }
}

TEST(TraceLineTest, AnEventHasItsLinesTimeAndItsNumbersFromTheFront) {
    TraceLine line;
    ASSERT_EQ(judge(call("SDCImpl.process", R"({"data": [1, 2.5], "type": 8})"), &line), "");
    const auto event = std::get<sensors_event_t>(std::get<Call>(line.action).arguments[0]);
    EXPECT_EQ(event.timestamp, 7'000'000);
    EXPECT_EQ(event.type, 8);
    EXPECT_EQ(event.data[0] + event.data[1] + event.data[2], 3.5F);
}

TEST(TraceLineTest, ManyKeysAreJudgedAndTheSecondOfOneIsFound) {
    std::string keys;
    for (int i = 0; i < 100'000; ++i) keys += '"' + std::to_string(i) + R"(": "", )";
    const std::string line = R"({"at": 7, "property": {)" + keys;
    EXPECT_EQ(judge(line + R"("x": ""}})"), "");
    EXPECT_EQ(judge(line + R"("99999": ""}})"), R"(the key "99999" twice)");
}

TEST(TraceLineTest, ACallIsOfferedForAnUnknownNameAndAllAreListed) {
    const std::pair<const char*, const char*> kNames[] = {
            {"SDCImpl.enableSucess", "SDCImpl.enableSuccess"},
            {"SDCImpl.process(event)", "SDCImpl.process"},
            {"RgbShotManager.isEmpy", "RgbShotManager.isEmpty"},
            {"gbShotManager.skipLux", "RgbShotManager.skipLux"},
            {"UltraException.doActoin", "UltraException.doAction"},
    };
    for (const auto& [name, nearest] : kNames) EXPECT_EQ(nearestCall(name), nearest) << name;
    EXPECT_FALSE(nearestCall(std::string(1'000'000, 'x')).empty());
    const std::string list = listCalls();
    for (const char* line :
         {"SDCImpl.getInstance []\n",
          "SDCImpl.enableSuccess [true or false, integer, text, text, integer of 64 bits]\n",
          "SDCImpl.cleanupConnection [text, text, integer]\n",
          "SDCImpl.process [{\"type\": integer, \"data\": [number, ...]}]\n",
          "SDCImpl.setNotification [[integer, ...]]\n",
          "RgbShotManager.getScreenPixcel [[left, top, right, bottom]]\n",
          R"(UltraException.doAction [integer, {"packageName": text, "phoneState": integer}])"}) {
        EXPECT_NE(list.find(line), std::string::npos) << line;
    }
}

TEST(TraceLineTest, BlankLinesAndRemarksAreSkipped) {
    for (const char* text : {"", " ", "\t\r", "#", " \t# {"}) EXPECT_TRUE(isSkipped(text)) << text;
    for (const char* text : {"{}", " {", "\v", "x#"}) EXPECT_FALSE(isSkipped(text)) << text;
}

/** Gives a text, then blanks, then another text, in pieces. */
class Text : public base::ByteSource {
public:
    Text(std::string before, size_t blanks, std::string after)
          : mText(std::move(before) + std::string(blanks, ' ') + std::move(after)) {}

    ssize_t read(char* data, size_t size) override {
        const size_t count = std::min({size, mText.size() - mRead, size_t{100'003}});
        std::memcpy(data, mText.data() + mRead, count);
        mRead += count;
        return static_cast<ssize_t>(count);
    }

    std::string error() const override { return "broken"; }

private:
    const std::string mText;
    size_t mRead = 0;
};

TEST(LineReaderTest, ALineMayHave64MiBAndNoByteMore) {
    constexpr size_t kLimit = 67'108'864;
    for (const char* end : {"", "\nx"}) {
        base::LineReader whole(std::make_unique<Text>("a\n", kLimit, end));
        EXPECT_EQ(whole.next()->size(), 1u);
        EXPECT_EQ(whole.next()->size(), kLimit) << end;
        EXPECT_EQ(whole.next().has_value(), *end != '\0');
        EXPECT_EQ(whole.error(), std::nullopt);

        base::LineReader tooLong(std::make_unique<Text>("a\n", kLimit + 1, end));
        EXPECT_EQ(tooLong.next()->size(), 1u);
        EXPECT_EQ(tooLong.next(), std::nullopt);
        EXPECT_EQ(tooLong.error(), "the line is longer than 64 MiB");
        EXPECT_EQ(tooLong.lineNumber(), 2);
    }
}

TEST(LineReaderTest, AByteOrderMarkIsSkippedAtTheStartOnly) {
    base::LineReader reader(std::make_unique<Text>("\xEF\xBB\xBF{}\n\xEF\xBB\xBFx\n\n", 0, "last"));
    for (const char* line : {"{}", "\xEF\xBB\xBFx", "", "last"}) EXPECT_EQ(reader.next(), line);
    EXPECT_EQ(reader.next(), std::nullopt);
    base::LineReader half(std::make_unique<Text>("\xEF\xBB{}", 0, ""));
    EXPECT_EQ(half.next(), "\xEF\xBB{}");
}

}  // namespace
}  // namespace trace
