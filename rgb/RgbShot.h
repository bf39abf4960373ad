#pragma once

#include <cstdint>

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>

#include "core/Export.h"

namespace android {

/**
 * Counts the screen samples taken, keeps the count in "persist.zuno.rgb.shot.count" and reports it
 * once a day as "N273|10009". `SDCImpl` calls it.
 *
 * All operations may be called from any thread. `mLock` is held for the count only, never while a
 * message is posted, a property is touched or telemetry is sent.
 */
class SENSOR_PRIV_EXPORT RgbShot {
public:
    /**
     * The single instance; the first call creates it and posts the load of the stored count, due
     * 2000 ms later. Locks `sLock`.
     */
    static RgbShot* getInstance();

    RgbShot();

    /** Counts one sample; the count is stored 500 ms after the last sample of a burst. */
    void setRgbShotCount();

    /**
     * Replaces the count by the stored one, 0 if there is none, without `mLock`. Samples counted
     * before are lost unless they have been stored, in which case they have replaced what was
     * stored before.
     */
    void initRgbShotCount();

    /** Stores the count. */
    void updateRgbShotCount();

    /**
     * Reports the count, 0 included, on the caller's thread, then sets it to 0. The stored count
     * stays until the next sample is stored: a restart in between loads what was reported.
     */
    void putRgbShotTally();

    /** Sets the count to 0 without a report; the stored count stays as for `putRgbShotTally`. */
    void notifyRgbShotReset();

private:
    class RgbShotHandler;

    // Samples since the last report or reset; loaded without the lock (see initRgbShotCount).
    int32_t mRgbShotCount;
    Mutex mLock;

    // Constant after construction.
    const sp<MessageHandler> mHandler;

    static Mutex sLock;
    static RgbShot* mRgbShot GUARDED_BY(sLock);
};

}  // namespace android
