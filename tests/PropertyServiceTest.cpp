#include "platform/PropertyService.h"

#include <cstdio>
#include <filesystem>
#include <fstream>

#include <cutils/properties.h>

#include "tests/DeviceTest.h"

namespace {

class PropertyServiceTest : public DeviceTest {
protected:
    ~PropertyServiceTest() override { std::filesystem::remove_all(mFolder); }

    std::string file(const std::string& name) const { return mFolder / name; }

    const std::filesystem::path mFolder =
            ::testing::TempDir() + "properties-" + std::to_string(getpid());

private:
    const bool mMade = std::filesystem::create_directories(mFolder);
};

TEST_F(PropertyServiceTest, RefusesWhatTheDeviceRefuses) {
    EXPECT_EQ(property_set("", "1"), -1);
    EXPECT_EQ(property_set(nullptr, "1"), -1);
    EXPECT_EQ(property_set("persist.zuno.ultra.phone.enable.count", "1"), 0);
    EXPECT_EQ(property_set(std::string(65535, 'n').c_str(), "1"), 0);
    EXPECT_EQ(property_set(std::string(65536, 'n').c_str(), "1"), -1);
    EXPECT_EQ(property_set("a", std::string(91, 'v').c_str()), 0);
    EXPECT_EQ(property_set("a", std::string(92, 'w').c_str()), -1);
    EXPECT_EQ(property("a"), std::string(91, 'v'));
    EXPECT_EQ(property_set("ro.a", "first"), 0);
    EXPECT_EQ(property_set("ro.a", "second"), -1);
    EXPECT_EQ(property("ro.a"), "first");
    platform::setDeviceProperty("ro.a", "new image");
    EXPECT_EQ(property("ro.a"), "new image");
}

TEST_F(PropertyServiceTest, AnEmptyValueReadsAsUnset) {
    char value[PROP_VALUE_MAX] = "old";
    EXPECT_EQ(property_get("a", value, "default"), 7);
    EXPECT_STREQ(value, "default");
    setProperty("a", "");
    EXPECT_EQ(property_get("a", value, "default"), 7);
    EXPECT_EQ(property_get("a", value, nullptr), 0);
    EXPECT_STREQ(value, "");
    EXPECT_EQ(property_get("a", value, std::string(200, 'd').c_str()), 91);
    setProperty("a", "x");
    EXPECT_EQ(property_get("a", value, "default"), 1);
}

TEST_F(PropertyServiceTest, AFileKeepsWhatSurvivesABoot) {
    ASSERT_EQ(platform::openProperties(file("store")), std::nullopt);
    property_set("persist.a", "1");
    property_set("ro.b", "2");
    property_set("sys.c", "3");
    property_set("persistent", "4");
    ASSERT_EQ(platform::openProperties(file("other")), std::nullopt);
    EXPECT_EQ(property("persist.a"), "");
    ASSERT_EQ(platform::openProperties(file("store")), std::nullopt);
    EXPECT_EQ(property("sys.c"), "3");
    platform::dropVolatileProperties();
    EXPECT_EQ(property("persist.a") + property("ro.b"), "12");
    EXPECT_EQ(property("sys.c") + property("persistent"), "");
}

TEST_F(PropertyServiceTest, NamesAFileThatCannotKeepProperties) {
    ASSERT_EQ(platform::openProperties(file("store")), std::nullopt);
    property_set("persist.a", "1");
    std::ofstream(file("text")) << std::string(5000, 'x');
    // A store whose second half is damaged opens, but not its pages.
    ASSERT_EQ(platform::openProperties(file("torn")), std::nullopt);
    for (int i = 0; i < 500; ++i) property_set(("persist." + std::to_string(i)).c_str(), "value");
    ASSERT_EQ(platform::openProperties(file("store")), std::nullopt);
    const auto size = std::filesystem::file_size(file("torn"));
    std::fstream(file("torn"), std::ios::in | std::ios::out).seekp(size / 2)
            << std::string(size / 2, 'x');

    for (const std::string& path :
         {file("text"), file("torn"), file("missing/store"), file(""), std::string()}) {
        const auto error = platform::openProperties(path);
        ASSERT_TRUE(error) << path;
        EXPECT_EQ(error->find(path + ": "), 0u) << *error;
        EXPECT_EQ(error->find('\n'), std::string::npos) << *error;
    }
    EXPECT_EQ(property("persist.a"), "1") << "the properties stay where they were";
    EXPECT_EQ(platform::propertyFileError(), std::nullopt);
}

}  // namespace
