#pragma once

#include <cstdint>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"

namespace android {

/**
 * Counts screen samples, keeps the count in "persist.zuno.rgb.shot.count" and reports it daily as
 * "N273|10009". `SDCImpl` calls it.
 *
 * Any thread may call any operation. `mLock` is held only to read or change the count.
 */
class SENSOR_PRIV_EXPORT RgbShot {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static RgbShot* getInstance();

    /** Posts the load of the stored count, due in 2000 ms. */
    RgbShot();

    /** Counts one sample. The count is stored 500 ms after the last sample of a burst. */
    void setRgbShotCount();

    /**
     * Loads the stored count, 0 if there is none. Samples not yet saved are lost; saved ones have
     * already overwritten the stored count.
     */
    void initRgbShotCount();

    /** Stores the count. */
    void updateRgbShotCount();

    /**
     * Reports the count on the caller's thread, 0 too, and sets it to 0. The stored count stays
     * until the next sample is saved, so a restart before that loads the reported count again.
     */
    void putRgbShotTally();

    /** Sets the count to 0 without a report. The stored count stays likewise. */
    void notifyRgbShotReset();

private:
    class RgbShotHandler;

    // Samples since the last report or reset. The load alone writes it without the lock.
    int32_t mRgbShotCount;
    Mutex mLock;

    // Constant after construction.
    const sp<MessageHandler> mHandler;

    static Mutex sLock;
    static RgbShot* mRgbShot GUARDED_BY(sLock);
};

}  // namespace android
