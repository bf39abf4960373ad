#include "rgb/LightSensorState.h"

#include <cstdint>

#include <gtest/gtest.h>

namespace {

TEST(LightSensorStateTest, TheVariablesHaveTheirDefaults) {
    EXPECT_EQ(frameworkLux, -1);
    EXPECT_EQ(downLux, -1);
    EXPECT_EQ(upLux, 300'000);
    EXPECT_EQ(ACL, 1);
    EXPECT_EQ(transitionStatus, 1);
    EXPECT_TRUE(screenOnFirstLight && displayChanged && useFrontLightOnly);
    EXPECT_FALSE(useAutoBrightness || lastAutobrightness || luxPersist);
    for (const int32_t* zero :
         {&policy, &brightness, &lcmBrightness, &appSwitch, &displayColorMode, &displayDcState,
          &displayId, &lightId, &nightMode, &eyeProtection, &rectifiedLux, &rectifiedLuxMainTop,
          &rectifiedLuxMainBottom, &rectifiedLuxSecondary}) {
        EXPECT_EQ(*zero, 0);
    }
}

}  // namespace
