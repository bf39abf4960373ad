#pragma once

#include <map>
#include <string>
#include <vector>

#include <utils/Mutex.h>

#include "core/Export.h"

namespace android {

/** One telemetry event, ready to be handed over. */
struct DataWrapper {
    std::string eventId;  // in full: the module id, a bar and five digits, as in "N273|10009"
    std::string payload;  // as `TallyCommon::convertMapToTally` builds it
};

/**
 * The one place through which statistics modules send telemetry, with the text helpers that they
 * share. May be called from any thread; apart from `getInstance()` nothing locks.
 */
class SENSOR_PRIV_EXPORT TallyCommon {
public:
    /** The single instance, created by the first call. Locks `sLock`. */
    static TallyCommon* getInstance();

    TallyCommon();

    /**
     * Sends `params` as the event `eventId`, on the caller's thread. Nothing is reported back and
     * nothing is kept for a retry.
     */
    void trackEvent(std::string eventId, std::map<std::string, std::string> params);

    /** Logs the event id while `mLogSwitch` is on, then hands the event to `track_event`. */
    void setTally(DataWrapper data);

    /**
     * `params` as key:value pairs joined by "&", in ascending bytewise order of the keys. Nothing
     * is escaped: keys and values must do without ":" and "&". An empty map gives an empty text.
     */
    std::string convertMapToTally(std::map<std::string, std::string> params);

    /** `value` in decimal. */
    std::string intToStr(int value);
    std::string longToStr(long value);

    /**
     * Cuts `text` at every `delimiter` and puts the pieces, empty ones included, into `out`, which
     * then holds at least one piece. `text` and `delimiter` may lie in `out`. Meant for delimiters
     * of one character: of a longer one, the first cut is made at any of its characters.
     */
    void splitStr(const std::string& text, const std::string& delimiter,
                  std::vector<std::string>& out);

    /**
     * Blocks the caller until the property "service.bootanim.exit" reads 1, looking every 200 ms
     * for as long as it takes. Returns at once if any earlier call has seen that.
     */
    void BootNotFinish();

private:
    const std::string mModuleId;  // constant after construction

    // Set once and never cleared; read and written by every waiting thread without a lock.
    bool mBootFinished;

    static Mutex sLock;
    static TallyCommon* mTallyCommon GUARDED_BY(sLock);
};

}  // namespace android
