#pragma once

#include "tests/forms/Forms.h"

namespace android::gui {

using BnScreenCaptureListener = form::PLATFORM_FORM::BnScreenCaptureListener;

}  // namespace android::gui
