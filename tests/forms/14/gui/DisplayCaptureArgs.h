#pragma once

#include "tests/forms/Requests.h"

namespace android {

namespace gui {

using DisplayCaptureArgs = form::PLATFORM_FORM::DisplayCaptureArgs;

}  // namespace gui

using gui::DisplayCaptureArgs;

}  // namespace android
