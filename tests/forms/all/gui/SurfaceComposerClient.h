#pragma once

#include "tests/forms/Forms.h"

namespace android {

using SurfaceComposerClient = form::PLATFORM_FORM::SurfaceComposerClient;
using ScreenshotClient = form::PLATFORM_FORM::ScreenshotClient;

}  // namespace android
