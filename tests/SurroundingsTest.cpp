#include "record/Surroundings.h"

#include "record/Library.h"
#include "tests/DeviceTest.h"

namespace record {

/** The host's library has none of the variables. */
const void* findVariable(const char*) {
    return nullptr;
}

namespace {

class SurroundingsTest : public DeviceTest {};

TEST_F(SurroundingsTest, APropertyIsNotLookedAtWhileItIsBeingWritten) {
    constexpr char kCount[] = "persist.zuno.rgb.shot.count";
    constexpr char kSeven[] = R"("property": {"persist.zuno.rgb.shot.count": "7"})";
    Surroundings surroundings;
    EXPECT_NE(surroundings.takeProperties().find(R"("persist.zuno.rgb.shot.count": null)"),
              std::string::npos);
    EXPECT_EQ(surroundings.takeProperties(), "");
    surroundings.beginWrite(kCount, "5");
    surroundings.beginWrite(kCount, "6");
    setProperty(kCount, "7");  // one of them comes behind it, or somebody else's does
    surroundings.endWrite(kCount);
    EXPECT_EQ(surroundings.takeProperties() + surroundings.takeProperty(kCount), "");
    surroundings.endWrite(kCount);
    EXPECT_EQ(surroundings.takeProperties(), kSeven);
    surroundings.beginWrite(kCount, "8");
    setProperty(kCount, "8");
    surroundings.endWrite(kCount);
    EXPECT_EQ(surroundings.takeProperty(kCount), "") << "a replay sets it by itself";
    surroundings.forget();
    EXPECT_EQ(surroundings.takeProperty(kCount),
              R"("property": {"persist.zuno.rgb.shot.count": "8"})");
}

}  // namespace
}  // namespace record
