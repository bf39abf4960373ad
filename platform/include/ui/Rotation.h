#pragma once

namespace android::ui {

/** How far content is turned from how the display lies, in quarter turns. */
enum class Rotation { Rotation0 = 0, Rotation90 = 1, Rotation180 = 2, Rotation270 = 3 };

}  // namespace android::ui
