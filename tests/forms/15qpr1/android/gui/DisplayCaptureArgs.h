#pragma once

#include "tests/forms/Requests.h"

namespace android::gui {

using DisplayCaptureArgs = form::PLATFORM_FORM::DisplayCaptureArgs;

}  // namespace android::gui
