/**
 * Calls the library's capture that is compiled for PLATFORM_FORM. The build gives its classes names
 * of their own, so that all forms fit into one program.
 */

#include "rgb/RgbShotManager.h"
#include "tests/forms/Forms.h"

android::RgbShotManager::RgbShotManager() : mNameList(nullptr) {}

template <>
int form::getScreenPixcel<form::PLATFORM_FORM>(int* rgbOut, int* rect) {
    return android::RgbShotManager().getScreenPixcel(rgbOut, rect);
}
