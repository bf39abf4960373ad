#pragma once

#include <cstdint>
#include <string_view>

#include "capture/dump/Dump.h"

namespace capture {

/** A kind of section in a capture: how it begins, and what reads its lines. */
struct Section;

/**
 * Finds the sections of a capture that tell of sensors and of the device's states among everything
 * else that it holds; DumpReader.cpp has their table. Of several reports in one text, and of
 * several texts of the sensor service, the first with registrations counts.
 */
class DumpReader {
public:
    DumpReader();

    /** Takes the next line, as the text has it. */
    void takeLine(std::string_view line, int64_t lineNumber);

    /** What was read, when the last line has come. */
    Dump finish();

private:
    /** Whose text the lines are. */
    enum class Service {
        kUnknown,  // a capture may hold nothing but the text of a service, without a heading
        kSensors,
        kBattery,
        kOther,
    };

    void startReport(std::string_view text);
    void startService(std::string_view name);
    void endService(std::string_view text);
    void takeServiceLine(std::string_view text, int64_t lineNumber);

    /** Starts the section that `text` is the heading of, if it is one. */
    bool startSection(std::string_view text, int64_t lineNumber);
    bool mayBegin(const Section& section) const;

    /** Whether the lines that come may be the sensor service's. */
    bool isSensors() const {
        return mService == Service::kUnknown || mService == Service::kSensors;
    }

    Dump mDump;
    Service mService = Service::kUnknown;
    const Section* mSection;   // null: in none of them
    bool mTakesFooter = true;  // of the sensor service's text that counts
    bool mIsDone = false;      // another report has begun
};

}  // namespace capture
