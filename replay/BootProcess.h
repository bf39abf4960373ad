#pragma once

#include <functional>
#include <optional>
#include <string>

#include "base/Result.h"
#include "replay/Player.h"
#include "trace/Record.h"

namespace replay {

/** What of a device survives its boots, beside the display. */
struct Device {
    std::optional<std::string> propertyFile;  // keeps the properties; without one they are
    std::string properties;                   // these, as bytes
};

/** Who follows boots while they run. */
struct Listener {
    std::function<void(const trace::Record&)> take;

    /** There are no records for now; called again and again while none come. */
    std::function<void()> idle;
};

/**
 * Runs one boot of the library in a process of its own, forked from this one. The process dies with
 * this one.
 */
base::Result<NextBoot> runBoot(const Boot& boot, const trace::TraceLine* first,
                               trace::WantedRecords wanted, Device* device,
                               trace::TraceReader* reader, const Listener& listener);

}  // namespace replay
