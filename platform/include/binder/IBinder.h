#pragma once

#include <utils/RefBase.h>

namespace android {

/** A reference to an object of another process; here it only tells such objects apart. */
class IBinder : public virtual RefBase {
protected:
    IBinder() = default;
    ~IBinder() override = default;
};

}  // namespace android
