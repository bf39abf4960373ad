#include "tests/DeviceTest.h"

#include <sstream>
#include <utility>

#include <android/log.h>
#include <cutils/properties.h>

#include "clock/VirtualClock.h"
#include "platform/PropertyService.h"
#include "platform/Telemetry.h"
#include "tests/Locks.h"

namespace {

/** Never destroyed: the worker thread outlives the test. */
Lines& transcript() {
    static auto* const instance = new Lines;
    return *instance;
}

template <typename... Parts>
void note(const Parts&... parts) {
    std::ostringstream line;
    line << static_cast<double>(virtual_clock::now()) / 1e6 << ' ';
    (line << ... << parts);
    transcript().push_back(line.str());
}

}  // namespace

DeviceTest::DeviceTest() {
    __android_log_set_minimum_priority(ANDROID_LOG_VERBOSE);
    __android_log_set_logger([](const __android_logger_data* data, const char* text) {
        note("log ", data->priority, ' ', text);
    });
    platform::observeEvents([](const char* module, const char* id, const char* payload) {
        EXPECT_STREQ(module, "N273");
        EXPECT_EQ(locksHeld(), 0);
        note(id, ' ', payload);
    });
    platform::observePropertySet([](const char* name, const char* value) {
        EXPECT_EQ(locksHeld(), 0);
        note(name, '=', value);
    });
}

void DeviceTest::advanceTo(double ms) {
    virtual_clock::advanceTo(static_cast<int64_t>(ms * 1e6));
}

Lines DeviceTest::taken() {
    return std::exchange(transcript(), {});
}

void DeviceTest::setProperty(const std::string& name, const std::string& value) {
    platform::setDeviceProperty(name, value);
}

std::string DeviceTest::property(const std::string& name) {
    char value[PROP_VALUE_MAX];
    property_get(name.c_str(), value, "");
    return value;
}

android::Vector<int> DeviceTest::listOf(const std::vector<int>& values) {
    android::Vector<int> list;
    list.setCapacity(values.size());
    list.appendArray(values.data(), values.size());
    return list;
}
