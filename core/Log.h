#pragma once

#include <android/log.h>

/**
 * While this is not 0, the library writes its detailed log lines. The vendor's sensor configuration
 * library defines it, the host writes it, and the library reads it without a lock.
 */
extern int mLogSwitch;

/** The tag of every log line of the library. */
#define SENSOR_PRIV_LOG_TAG "_Z_ZSensorFusion"

#define SENSOR_PRIV_LOGD(...) \
    __android_log_print(ANDROID_LOG_DEBUG, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
#define SENSOR_PRIV_LOGI(...) \
    __android_log_print(ANDROID_LOG_INFO, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
#define SENSOR_PRIV_LOGE(...) \
    __android_log_print(ANDROID_LOG_ERROR, SENSOR_PRIV_LOG_TAG, __VA_ARGS__)
