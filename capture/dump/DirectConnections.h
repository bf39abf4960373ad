#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "capture/dump/SkippedLines.h"
#include "trace/Note.h"

namespace capture {

/** The table "N direct connections": who gets samples without the sensor service's help. */
class DirectConnections {
public:
    /** Takes a line without blanks around it, in the older or the newer form; ignores others. */
    void takeLine(std::string_view text, int64_t lineNumber);

    const std::vector<trace::DirectChannel>& channels() const { return mChannels; }
    const SkippedLines& unreadable() const { return mUnreadable; }

private:
    bool takeOlder(std::string_view text);
    bool takeNewer(std::string_view text);
    bool takeSensor(std::string_view text);

    std::vector<trace::DirectChannel> mChannels;
    SkippedLines mUnreadable;
};

}  // namespace capture
