#pragma once

#include "tests/forms/Requests.h"
#include "tests/forms/all/gui/SurfaceComposerClient.h"

namespace android {

using DisplayCaptureArgs = form::PLATFORM_FORM::DisplayCaptureArgs;

}  // namespace android
