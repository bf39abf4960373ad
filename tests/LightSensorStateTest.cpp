#include "rgb/LightSensorState.h"

#include <cstdint>
#include <variant>

#include <gtest/gtest.h>

namespace {

TEST(LightSensorStateTest, TheVariablesHaveTheWidthsAndDefaultsThatTheHostLinksAgainst) {
    const struct {
        const char* name;
        std::variant<const int32_t*, const bool*> variable;
        int32_t value;
    } kVariables[] = {
            {"frameworkLux", &frameworkLux, -1},
            {"ACL", &ACL, 1},
            {"upLux", &upLux, 300'000},
            {"downLux", &downLux, -1},
            {"transitionStatus", &transitionStatus, 1},
            {"screenOnFirstLight", &screenOnFirstLight, true},
            {"displayChanged", &displayChanged, true},
            {"useFrontLightOnly", &useFrontLightOnly, true},
            {"policy", &policy, 0},
            {"brightness", &brightness, 0},
            {"lcmBrightness", &lcmBrightness, 0},
            {"appSwitch", &appSwitch, 0},
            {"displayColorMode", &displayColorMode, 0},
            {"displayDcState", &displayDcState, 0},
            {"displayId", &displayId, 0},
            {"lightId", &lightId, 0},
            {"nightMode", &nightMode, 0},
            {"eyeProtection", &eyeProtection, 0},
            {"rectifiedLux", &rectifiedLux, 0},
            {"rectifiedLuxMainTop", &rectifiedLuxMainTop, 0},
            {"rectifiedLuxMainBottom", &rectifiedLuxMainBottom, 0},
            {"rectifiedLuxSecondary", &rectifiedLuxSecondary, 0},
            {"useAutoBrightness", &useAutoBrightness, false},
            {"lastAutobrightness", &lastAutobrightness, false},
            {"luxPersist", &luxPersist, false},
    };
    for (const auto& [name, variable, value] : kVariables) {
        EXPECT_EQ(std::visit([](const auto* each) -> int32_t { return *each; }, variable), value)
                << name;
    }
}

}  // namespace
