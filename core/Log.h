#pragma once

#include <android/log.h>

/**
 * The host's switch for the library's detailed log lines: they are written while it is not 0. It
 * lives in the vendor's sensor configuration library and is read without a lock.
 */
extern int mLogSwitch;

/** The one tag of all log lines of the library. */
#define SENSOR_PRIV_LOG_TAG "_Z_ZSensorFusion"

#define SENSOR_PRIV_LOGD(...) \
    __android_log_print(ANDROID_LOG_DEBUG, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
#define SENSOR_PRIV_LOGI(...) \
    __android_log_print(ANDROID_LOG_INFO, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
#define SENSOR_PRIV_LOGE(...) \
    __android_log_print(ANDROID_LOG_ERROR, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
