#include "platform/Telemetry.h"

#include <string>

#include <android/log.h>
#include <gtest/gtest.h>

namespace {

std::string happened;  // since a test has cleared it

void note(const char* a, const char* b, const char* c) {
    happened += std::string(a) + ' ' + b + ' ' + c + '\n';
}

TEST(TelemetryTest, AnEventIsLoggedUnlessAnObserverTakesIt) {
    __android_log_set_logger([](const __android_logger_data* data, const char* text) {
        note(std::to_string(data->priority).c_str(), data->tag, text);
    });
    track_event("N273", "N273|10009", "count:3");
    EXPECT_EQ(happened, "4 N273 N273|10009 count:3\n");
    happened.clear();
    platform::observeEvents(note);
    track_event("N273", "N273|10010", "%s");
    EXPECT_EQ(happened, "N273 N273|10010 %s\n");
}

}  // namespace
