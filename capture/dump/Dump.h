#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "capture/dump/BatteryHistory.h"
#include "capture/dump/BatteryStatistics.h"
#include "capture/dump/Connections.h"
#include "capture/dump/DirectConnections.h"
#include "capture/dump/EventLog.h"
#include "capture/dump/RecentEvents.h"
#include "capture/dump/RegistrationList.h"
#include "capture/dump/SensorDevice.h"
#include "capture/dump/SensorList.h"

namespace capture {

/** What the text of the sensor service says beside the registrations. */
struct SensorService {
    std::optional<int64_t> footer;      // when its answer ended; a wall time
    std::optional<int64_t> capturedAt;  // when it answered: a time of day, whole seconds
    SensorList sensors;
    SensorDevice device;
    RecentEvents events;
    std::optional<Connections> connections;
    DirectConnections direct;
};

/** What a capture holds. Stamps are wall times of the device. */
struct Dump {
    bool isCapture = false;         // it looks like a capture or a bug report
    bool hasService = false;        // it holds the sensor service's text
    bool hasNoSensors = false;      // and that says so
    std::optional<int64_t> header;  // when the bug report began
    std::string build;              // of the system; empty if that is not said
    SensorService service;
    RegistrationList registrations;
    std::optional<BatteryHistory> history;
    int64_t historyStart = 0;  // line of its heading
    std::optional<EventLog> log;
    int64_t logStart = 0;  // line of its heading
    BatteryStatistics statistics;

    /** When it was taken, as far as that is known. */
    std::optional<int64_t> taken() const { return service.footer ? service.footer : header; }
};

}  // namespace capture
