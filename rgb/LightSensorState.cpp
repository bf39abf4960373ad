#include "rgb/LightSensorState.h"

int32_t frameworkLux = -1;
int32_t ACL = 1;
int32_t upLux = 300000;
int32_t downLux = -1;
int32_t transitionStatus = 1;
bool screenOnFirstLight = true;
bool displayChanged = true;
bool useFrontLightOnly = true;
int32_t policy = 0;
int32_t brightness = 0;
int32_t lcmBrightness = 0;
int32_t appSwitch = 0;
int32_t displayColorMode = 0;
int32_t displayDcState = 0;
int32_t displayId = 0;
int32_t lightId = 0;
int32_t nightMode = 0;
int32_t eyeProtection = 0;
int32_t rectifiedLux = 0;
int32_t rectifiedLuxMainTop = 0;
int32_t rectifiedLuxMainBottom = 0;
int32_t rectifiedLuxSecondary = 0;
bool useAutoBrightness = false;
bool lastAutobrightness = false;
bool luxPersist = false;
