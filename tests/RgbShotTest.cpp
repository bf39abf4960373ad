#include "rgb/RgbShot.h"

#include "tests/DeviceTest.h"

namespace android {
namespace {

constexpr char kCount[] = "persist.zuno.rgb.shot.count";

class RgbShotTest : public DeviceTest {
protected:
    void sampleAt(double ms) {
        advanceTo(ms);
        RgbShot::getInstance()->setRgbShotCount();
    }
};

TEST_F(RgbShotTest, ASampleStoredBeforeTheLoadReplacesTheStoredCount) {
    setProperty(kCount, "40");
    RgbShot::getInstance();
    sampleAt(1000);
    advanceTo(3000);
    sampleAt(3000);
    advanceTo(4000);
    EXPECT_EQ(taken(),
              (Lines{"1500 persist.zuno.rgb.shot.count=1", "3500 persist.zuno.rgb.shot.count=2"}));
}

TEST_F(RgbShotTest, ASampleThatWaitsForTheLoadIsLost) {
    setProperty(kCount, "40");
    RgbShot::getInstance();
    sampleAt(1600);
    advanceTo(3000);
    EXPECT_EQ(taken(), (Lines{"2100 persist.zuno.rgb.shot.count=40"}));
}

/** What is stored, and what it is loaded as. */
class StoredCountTest : public RgbShotTest,
                        public ::testing::WithParamInterface<std::pair<const char*, const char*>> {
};

TEST_P(StoredCountTest, IsReadAsTheNearestNumber) {
    setProperty(kCount, GetParam().first);
    RgbShot::getInstance();
    advanceTo(2000);
    RgbShot::getInstance()->putRgbShotTally();
    EXPECT_EQ(taken(), (Lines{std::string("2000 N273|10009 count:") + GetParam().second}));
}

INSTANTIATE_TEST_SUITE_P(Texts, StoredCountTest,
                         ::testing::Values(std::pair("", "0"), std::pair("abc", "0"),
                                           std::pair(" -12x", "-12"), std::pair("0x10", "0"),
                                           std::pair("99999999999999999999", "2147483647"),
                                           std::pair("-2147483649", "-2147483648")));

}  // namespace
}  // namespace android
