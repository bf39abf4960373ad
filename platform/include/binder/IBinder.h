#pragma once

#include <utils/RefBase.h>

namespace android {

/** A reference to an object of another process. The host uses its identity only. */
class IBinder : public virtual RefBase {
protected:
    IBinder() = default;
    ~IBinder() override = default;
};

}  // namespace android
