#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "replay/Player.h"
#include "report/Record.h"
#include "trace/Failure.h"

namespace replay {

/** What of a device survives its boots, beside the display. */
struct Device {
    std::optional<std::string> propertyFile;  // keeps the properties; without one they are
    std::string properties;                   // these, as bytes
};

/**
 * Runs one boot of the library in a process of its own, forked from this one, and hands its records
 * to `take`; `idle` is called whenever there are none left for now, and again and again while none
 * come. The process dies with this one.
 */
NextBoot runBoot(const Boot& boot, const trace::TraceLine* first, bool recordsCalls, Device* device,
                 trace::TraceReader* reader, const std::function<void(const report::Record&)>& take,
                 const std::function<void()>& idle, std::optional<trace::Failure>* failure);

}  // namespace replay
