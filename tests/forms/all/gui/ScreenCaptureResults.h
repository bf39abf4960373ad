#pragma once

#include "tests/forms/Forms.h"

namespace android::gui {

using ScreenCaptureResults = form::PLATFORM_FORM::ScreenCaptureResults;

}  // namespace android::gui
