#include "report/Payload.h"

#include <gtest/gtest.h>

#include "report/EventText.h"

namespace report {
namespace {

TEST(PayloadTest, TakesEachPayloadApartWhateverItsNamesHold) {
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
        const Fields fields = takeApart(id, payload);
        EXPECT_EQ(toJson(fields), json);
        EXPECT_EQ(describeEvent(id, fields), meaning) << payload;
    }
}

TEST(EventTextTest, AValueIsShownAsItsKindAndAsItIsIfItIsNoNumber) {
    for (const auto& [seconds, shown] :
         {std::pair("1801", "0:30:01"), {"-5", "-5"}, {"12x", "12x"}, {"", ""}, {"0", "0:00:00"}}) {
        const std::string payload = std::string("pkg:a/a&time:") + seconds;
        const EventText text = layOut(Event{0, "N273|10010", takeApart("N273|10010", payload)}, 1);
        ASSERT_EQ(text.values.size(), 2u);
        EXPECT_EQ(text.values[0].second, "a");
        EXPECT_EQ(text.values[1].second, shown);
    }
}

}  // namespace
}  // namespace report
