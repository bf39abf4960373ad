#pragma once

#include <ui/Rotation.h>
#include <ui/Size.h>

namespace android::ui {

/** What a display's content is drawn for. */
struct DisplayState {
    Rotation orientation = Rotation::Rotation0;
    Size layerStackSpaceRect;  // in this orientation
};

}  // namespace android::ui
