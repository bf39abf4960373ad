#pragma once

#include <map>
#include <string>
#include <vector>

#include <utils/Mutex.h>

#include "core/Export.h"

namespace android {

/** A telemetry event. */
struct DataWrapper {
    std::string eventId;  // module id, bar and five digits, as in "N273|10009"
    std::string payload;  // see `TallyCommon::convertMapToTally`
};

/**
 * Sends the telemetry of all statistics modules, and holds the text helpers that they share. Any
 * thread may call any operation. Only `getInstance()` locks.
 */
class SENSOR_PRIV_EXPORT TallyCommon {
public:
    /** The single instance. The first call creates it. Locks `sLock`. */
    static TallyCommon* getInstance();

    TallyCommon();

    /** Sends an event on the caller's thread. An event that fails is lost without a word. */
    void trackEvent(std::string eventId, std::map<std::string, std::string> params);

    /** Hands an event to `track_event`. While `mLogSwitch` is not 0, logs its id first. */
    void setTally(DataWrapper data);

    /**
     * Joins `params` as "key:value" pairs with "&", in bytewise order of the keys. Nothing is
     * escaped, so keys and values must do without ":" and "&". An empty map gives an empty text.
     */
    std::string convertMapToTally(std::map<std::string, std::string> params);

    /** `value` in decimal. */
    std::string intToStr(int value);
    std::string longToStr(long value);

    /**
     * Cuts `text` at every `delimiter` into `out`: one piece or more, empty ones included. `text`
     * and `delimiter` may be elements of `out`. Use delimiters of one character: with a longer one,
     * the first cut is at the first occurrence of any of its characters.
     */
    void splitStr(const std::string& text, const std::string& delimiter,
                  std::vector<std::string>& out);

    /**
     * Blocks until the property "service.bootanim.exit" reads 1. Looks every 200 ms, without a
     * time-out. Returns at once after any call has seen the 1.
     */
    void BootNotFinish();

private:
    const std::string mModuleId;  // constant after construction

    // Every waiting thread reads it and may set it, without a lock. Nothing clears it.
    bool mBootFinished;

    static Mutex sLock;
    static TallyCommon* mTallyCommon GUARDED_BY(sLock);
};

}  // namespace android
