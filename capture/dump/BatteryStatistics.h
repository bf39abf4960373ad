#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "capture/dump/SkippedLines.h"
#include "trace/Note.h"

namespace capture {

/** A bug report's battery statistics, "9,0,i,uid,10018,com.example": packages, and sensors' use. */
class BatteryStatistics {
public:
    /** Takes a line without blanks around it; ignores what tells neither. */
    void takeLine(std::string_view text, int64_t lineNumber);

    bool hasLines() const { return mHasLines; }

    /** The packages of each uid, each once. */
    const std::map<int32_t, std::vector<std::string>>& packages() const { return mPackages; }

    const trace::SinceCharge& sinceCharge() const { return mSinceCharge; }

    /** The version of the system that wrote them; empty if it is not said. */
    const std::string& build() const { return mBuild; }

    const SkippedLines& unreadable() const { return mUnreadable; }

private:
    bool takePackage(std::string_view fields);
    bool takeBattery(std::string_view fields);
    bool takeSensor(int32_t uid, std::string_view fields);

    bool mHasLines = false;
    std::map<int32_t, std::vector<std::string>> mPackages;
    trace::SinceCharge mSinceCharge;
    std::string mBuild;
    SkippedLines mUnreadable;
};

}  // namespace capture
