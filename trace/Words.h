#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include <hardware/sensors.h>

/**
 * What the library and its hosts call things: events, properties, sensors, notifications. All that
 * reads, writes or prints one of them uses these tables. What they mean in English stands in
 * report/.
 */
namespace trace {

enum class BootKind { kDevice, kProcess };

inline constexpr std::array<std::string_view, 2> kBootKinds{"device", "process"};

constexpr std::string_view nameOf(BootKind kind) {
    return kBootKinds[static_cast<size_t>(kind)];
}

/** What a host tells of the device, apart from its sensors. */
enum class DeviceState {
    kDisplay,  // 1 on, 0 off
    kCharge,   // 1 fast, 2 USB, 3 other, else none
    kCamera,   // 1 on, 0 off
    kCall,     // the voice mode: 0 no call
};

inline constexpr size_t kDeviceStates = 4;

/** A list of `SDCImpl.setNotification` that tells a state. */
struct Notification {
    DeviceState state;
    int32_t kind;               // the list's first element
    size_t element;             // the one that tells the state
    std::optional<int32_t> on;  // its value for 1, any other is 0; without, the value is the state
};

inline constexpr Notification kNotifications[] = {
        {DeviceState::kDisplay, 2, 2, 2},
        {DeviceState::kCall, 7, 7, std::nullopt},
        {DeviceState::kCamera, 10, 11, 1},
};

/** Who counts the time for which a sensor is held. */
enum class Watch { kNobody, kAccelerometer, kGyroscope, kOrientation, kProximity };

inline constexpr struct {
    int32_t type;
    Watch watch;
} kWatched[] = {
        {SENSOR_TYPE_ACCELEROMETER, Watch::kAccelerometer},
        {SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED, Watch::kAccelerometer},
        {SENSOR_TYPE_GYROSCOPE, Watch::kGyroscope},
        {SENSOR_TYPE_GYROSCOPE_UNCALIBRATED, Watch::kGyroscope},
        {SENSOR_TYPE_ORIENTATION, Watch::kOrientation},
        {SENSOR_TYPE_ROTATION_VECTOR, Watch::kOrientation},
        {SENSOR_TYPE_PROXIMITY, Watch::kProximity},
};

constexpr Watch watchOf(int32_t type) {
    for (const auto& each : kWatched) {
        if (each.type == type) return each.watch;
    }
    return Watch::kNobody;
}

/** The types whose sensors take samples all the time; makers' own types are not known. */
inline constexpr int32_t kContinuousTypes[] = {
        SENSOR_TYPE_ACCELEROMETER,
        SENSOR_TYPE_MAGNETIC_FIELD,
        SENSOR_TYPE_ORIENTATION,
        SENSOR_TYPE_GYROSCOPE,
        SENSOR_TYPE_PRESSURE,
        SENSOR_TYPE_GRAVITY,
        SENSOR_TYPE_LINEAR_ACCELERATION,
        SENSOR_TYPE_ROTATION_VECTOR,
        SENSOR_TYPE_MAGNETIC_FIELD_UNCALIBRATED,
        SENSOR_TYPE_GAME_ROTATION_VECTOR,
        SENSOR_TYPE_GYROSCOPE_UNCALIBRATED,
        SENSOR_TYPE_GEOMAGNETIC_ROTATION_VECTOR,
        SENSOR_TYPE_ACCELEROMETER_UNCALIBRATED,
};

constexpr bool isContinuousType(int32_t type) {
    for (const int32_t each : kContinuousTypes) {
        if (each == type) return true;
    }
    return false;
}

/** The sensors whose exceptions the library counts, in the order of its counts. */
inline constexpr int32_t kDetected[] = {
        SENSOR_TYPE_ACCELEROMETER, SENSOR_TYPE_GYROSCOPE,   SENSOR_TYPE_MAGNETIC_FIELD,
        SENSOR_TYPE_LIGHT,         SENSOR_TYPE_ORIENTATION, SENSOR_TYPE_ROTATION_VECTOR,
};

/** An event by its id and the form of its payload. */
enum class EventKind {
    kAccelerometerApps,
    kGyroscopeApps,
    kAccelerometerExceptions,
    kGyroscopeExceptions,
    kMagneticFieldExceptions,
    kLightExceptions,
    kOrientationExceptions,
    kRotationVectorExceptions,
    kScreenSamples,
    kLongProximity,
    kUltrasonic,
    kOrientationApps,
    kOrientationTotals,
    kChatCallLocked,
    kChatCalls,
    kUnknown,
};

/** A payload is "key:value&key:value..."; at most one value is a name from outside. */
struct EventForm {
    EventKind kind;
    std::string_view id;
    std::array<std::string_view, 7> keys;  // in the payload's order; empty behind the last
    size_t freeKey = 0;                    // of `keys`: the one whose value may hold anything
};

inline constexpr EventForm kEventForms[] = {
        {EventKind::kAccelerometerApps, "N273|10003", {"app_list"}},
        {EventKind::kGyroscopeApps, "N273|10004", {"app_list"}},
        {EventKind::kAccelerometerExceptions, "N273|10003", {"reason"}},
        {EventKind::kGyroscopeExceptions, "N273|10004", {"reason"}},
        {EventKind::kMagneticFieldExceptions, "N273|10005", {"reason"}},
        {EventKind::kLightExceptions, "N273|10006", {"reason"}},
        {EventKind::kOrientationExceptions, "N273|10007", {"reason"}},
        {EventKind::kRotationVectorExceptions, "N273|10008", {"reason"}},
        {EventKind::kScreenSamples, "N273|10009", {"count"}},
        {EventKind::kLongProximity, "N273|10010", {"pkg", "time"}},
        {EventKind::kUltrasonic,
         "N273|10011",
         {"TempInvalidRate", "pkg", "ultraEnergy", "ultraExpired"},
         1},
        {EventKind::kOrientationApps, "N273|10012", {"info"}},
        {EventKind::kOrientationTotals,
         "N273|10012",
         {"days", "fastChargeTime", "otherChargeTime", "pkg", "shockAndChargeTime", "totalTime",
          "usbChargeTime"},
         3},
        {EventKind::kChatCallLocked, "N273|10013", {"variance"}},
        {EventKind::kChatCalls, "N273|10013", {"invalid", "status", "total"}, 1},
};

/** A property that the library keeps, or reads. */
enum class Property {
    kOrientationDays,
    kOrientationFastCharging,
    kOrientationOtherCharging,
    kOrientationShockAndCharge,
    kOrientationTotal,
    kOrientationUsbCharging,
    kInvalidDevices,
    kDetectCounts,
    kScreenSamples,
    kInvalidRoutes,
    kReceiverClosures,
    kUltrasonicEnables,
    kInvalidCalls,
    kUltrasonicCalls,
    kChatCalls,
    kSkipRestriction,  // this and those below are only read
    kOverseas,
    kBootAnimation,
    kUnknown,
};

inline constexpr struct {
    std::string_view name;  // ends with a NUL
    Property property;
} kProperties[] = {
        {"persist.sys.ds_oriut", Property::kOrientationDays},
        {"persist.sys.fc_oriut", Property::kOrientationFastCharging},
        {"persist.sys.oc_oriut", Property::kOrientationOtherCharging},
        {"persist.sys.sc_oriut", Property::kOrientationShockAndCharge},
        {"persist.sys.skip_restrict", Property::kSkipRestriction},
        {"persist.sys.total_oriut", Property::kOrientationTotal},
        {"persist.sys.uc_oriut", Property::kOrientationUsbCharging},
        {"persist.zuno.device.invalid.count", Property::kInvalidDevices},
        {"persist.zuno.flow.detect.count", Property::kDetectCounts},
        {"persist.zuno.rgb.shot.count", Property::kScreenSamples},
        {"persist.zuno.route.invalid.count", Property::kInvalidRoutes},
        {"persist.zuno.rx.close.count", Property::kReceiverClosures},
        {"persist.zuno.ultra.enable.count", Property::kUltrasonicEnables},
        {"persist.zuno.ultra.invalid.count", Property::kInvalidCalls},
        {"persist.zuno.ultra.phone.enable.count", Property::kUltrasonicCalls},
        {"persist.zuno.wechat.count.info", Property::kChatCalls},
        {"ro.zuno.product.overseas", Property::kOverseas},
        {"service.bootanim.exit", Property::kBootAnimation},
};

constexpr Property propertyOf(std::string_view name) {
    for (const auto& each : kProperties) {
        if (each.name == name) return each.property;
    }
    return Property::kUnknown;
}

}  // namespace trace
