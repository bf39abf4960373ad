#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "capture/dump/SkippedLines.h"

namespace capture {

/** A client's connection to the sensor service. A client may have several. */
struct ClientConnection {
    std::string tag;
    int32_t uid = 0;
    std::vector<uint32_t> handles;  // of the sensors that are on, each once
    std::optional<bool> hasAccess;  // false: it gets no data
    std::optional<int64_t> wakeLocks;
};

/** The table "N active connections". What cannot be read of it is counted. */
class Connections {
public:
    /** `announced`: how many connections the heading promises. */
    Connections(int64_t announced, int64_t lineNumber)
          : mAnnounced(announced),
            mLineNumber(lineNumber) {}

    /** Takes a line without blanks around it; ignores those of an unknown form. */
    void takeLine(std::string_view text, int64_t lineNumber);

    /** In the printed order. */
    const std::vector<ClientConnection>& all() const { return mConnections; }

    /** The first operating mode that is not NORMAL. */
    const std::optional<std::string>& operatingMode() const { return mOperatingMode; }

    int64_t announced() const { return mAnnounced; }

    /** Of the heading. */
    int64_t lineNumber() const { return mLineNumber; }

    /** How many connections there are, those included that cannot be read. */
    int64_t found() const { return mFound; }

    const SkippedLines& unreadable() const { return mUnreadable; }

private:
    bool takeClient(std::string_view tag, std::string_view rest);
    bool takeSensor(std::string_view nameAndHandle);

    int64_t mAnnounced;
    int64_t mLineNumber;
    int64_t mFound = 0;
    bool mIsReadable = false;  // the client of the lines that come
    std::vector<ClientConnection> mConnections;
    std::optional<std::string> mOperatingMode;
    SkippedLines mUnreadable;
};

/** The count of a heading like "5 active connections"; `words` are those behind the number. */
std::optional<int64_t> parseCount(std::string_view heading, std::string_view words);

}  // namespace capture
