#pragma once

#include <cstdint>

#include "core/Export.h"

// Display, brightness and light as the host's light-sensor modules share them. The host reads and
// writes these variables from any thread, without a lock. Their meanings and units are the host's.
// The library defines them and reads `policy` only.

extern SENSOR_PRIV_EXPORT int32_t frameworkLux;
extern SENSOR_PRIV_EXPORT int32_t ACL;
extern SENSOR_PRIV_EXPORT int32_t upLux;
extern SENSOR_PRIV_EXPORT int32_t downLux;
extern SENSOR_PRIV_EXPORT int32_t transitionStatus;
extern SENSOR_PRIV_EXPORT bool screenOnFirstLight;
extern SENSOR_PRIV_EXPORT bool displayChanged;
extern SENSOR_PRIV_EXPORT bool useFrontLightOnly;

/** While this is 0, `RgbShotManager` allows samples in its test mode only. */
extern SENSOR_PRIV_EXPORT int32_t policy;

extern SENSOR_PRIV_EXPORT int32_t brightness;
extern SENSOR_PRIV_EXPORT int32_t lcmBrightness;
extern SENSOR_PRIV_EXPORT int32_t appSwitch;
extern SENSOR_PRIV_EXPORT int32_t displayColorMode;
extern SENSOR_PRIV_EXPORT int32_t displayDcState;
extern SENSOR_PRIV_EXPORT int32_t displayId;
extern SENSOR_PRIV_EXPORT int32_t lightId;
extern SENSOR_PRIV_EXPORT int32_t nightMode;
extern SENSOR_PRIV_EXPORT int32_t eyeProtection;
extern SENSOR_PRIV_EXPORT int32_t rectifiedLux;
extern SENSOR_PRIV_EXPORT int32_t rectifiedLuxMainTop;
extern SENSOR_PRIV_EXPORT int32_t rectifiedLuxMainBottom;
extern SENSOR_PRIV_EXPORT int32_t rectifiedLuxSecondary;
extern SENSOR_PRIV_EXPORT bool useAutoBrightness;
extern SENSOR_PRIV_EXPORT bool lastAutobrightness;
extern SENSOR_PRIV_EXPORT bool luxPersist;
