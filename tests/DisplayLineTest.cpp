#include <filesystem>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "base/LineReader.h"
#include "trace/TraceLine.h"

namespace trace {
namespace {

/** What is wrong with a line of `trace` that changes the display by `json`; empty if nothing is. */
std::string judge(const std::string& json, const std::string& trace, TraceLine* line) {
    std::string text = R"({"at": 0, "display": )" + json + '}';
    const size_t size = text.size();
    text.resize(size + base::LineReader::kPadding);
    return TraceParser().parse({text.data(), size}, trace, line).value_or("");
}

TEST(DisplayLineTest, APictureIsFoundBesideItsTrace) {
    const std::string example = std::filesystem::path(EXAMPLES) / "x.jsonl";
    TraceLine line;
    EXPECT_EQ(judge(R"({"png": "home-screen.png"})", example, &line), "");
    EXPECT_EQ(std::get<platform::DisplayChange>(line.action).picture->width, 540u);
    EXPECT_EQ(judge(R"({"png": "home-screen.png"})", "-", &line),
              R"("png" "home-screen.png": cannot open: No such file or directory)");
    EXPECT_EQ(judge(R"({"png": "home-screen.png", "color": [1, 2, 3]})", example, &line),
              R"("png" together with "size" or "color")");
    EXPECT_NE(judge(R"({"png": "sample-count.jsonl"})", example, &line), "");
}

TEST(DisplayLineTest, WhatIsWrongIsNamed) {
    const std::pair<const char*, const char*> kLines[] = {
            {R"([])", R"("display" must be an object)"},
            {R"({"colour": [1, 2, 3]})", R"(unknown key "colour")"},
            {R"({"color": [1, 2, 3], "color": null})", R"(the key "color" twice)"},
            {R"({"color": [1, 2]})", R"("color" must be an array of 3 integers)"},
            {R"({"color": [1, 2, 256]})", R"("color" must lie from 0 to 255)"},
            {R"({"size": [0, 1]})", R"("size" must lie from 1 to 2147483647)"},
            {R"({"size": [1.5, 1]})", R"("size" each element must be an integer of 32 bits)"},
            {R"({"rowPadding": -1})", R"("rowPadding" must lie from 0 to 16384)"},
            {R"({"rowPadding": true})", R"("rowPadding" must be an integer of 32 bits)"},
            {R"({"png": 3})", R"("png" must be a text)"},
            {R"({"fault": "tokens"})",
             R"("fault" must be "token", "capture", "results", "lock", "listener", "twice", )"
             R"("noDisplay", "fence" or null)"},
    };
    for (const auto& [json, error] : kLines) {
        TraceLine line;
        EXPECT_EQ(judge(json, "", &line), error);
    }
}

}  // namespace
}  // namespace trace
