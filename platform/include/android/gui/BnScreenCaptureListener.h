#pragma once

#include <android/gui/IScreenCaptureListener.h>

namespace android::gui {

/** A listener in this process. */
class BnScreenCaptureListener : public IScreenCaptureListener {};

}  // namespace android::gui
