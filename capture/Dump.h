#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "capture/BatteryHistory.h"
#include "capture/EventLog.h"
#include "capture/RegistrationList.h"
#include "capture/SensorList.h"

namespace capture {

/** What a capture holds. Stamps are local time of the device, see WallTime.h. */
struct Dump {
    bool isCapture = false;         // it looks like a capture or a bug report
    bool hasService = false;        // it holds the sensor service's text
    bool hasNoSensors = false;      // and that says so
    std::optional<int64_t> header;  // when the bug report began
    std::optional<int64_t> footer;  // when the sensor service had been asked
    SensorList sensors;
    RegistrationList registrations;
    std::optional<BatteryHistory> history;
    int64_t historyStart = 0;  // line of its heading
    std::optional<EventLog> log;
    int64_t logStart = 0;  // line of its heading

    /** When it was taken, as far as that is known. */
    std::optional<int64_t> taken() const { return footer ? footer : header; }
};

}  // namespace capture
