#pragma once

#include <cstdint>
#include <string_view>

#include "capture/Dump.h"

namespace capture {

/**
 * Finds the sensors, the registrations, the battery history and the event log of a device among
 * everything else that a capture holds. Of several reports in one text the first with registrations
 * counts.
 */
class DumpReader {
public:
    /** Takes the next line, as the text has it. */
    void line(std::string_view line, int64_t lineNumber);

    /** What was read, when the last line has come. */
    Dump finish();

private:
    void startReport(std::string_view text);
    void startService(std::string_view name);
    void endService(std::string_view text);
    void startSection(std::string_view text, int64_t lineNumber);
    void startHistory(std::string_view text, int64_t lineNumber);
    void historyLine(std::string_view text, int64_t lineNumber);
    void serviceLine(std::string_view text, int64_t lineNumber);
    void sensorLine(std::string_view text, int64_t lineNumber);

    Dump mDump;

    // A capture may hold nothing but the text of a service, without a heading.
    bool mTakesSensors = true;
    bool mTakesHistory = true;

    bool mTakesFooter = true;  // of the service's text that counts
    bool mInList = true;       // the list of sensors may come
    bool mInLog = false;
    bool mInHistory = false;
    bool mIsDone = false;  // another report has begun
};

}  // namespace capture
