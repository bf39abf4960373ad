#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "day/DayTable.h"
#include "report/Table.h"

namespace report {

/** The rows of a day as a table that shows at most `limit` of them. */
Table dayTable(const std::vector<day::DayRow>& rows, size_t limit);

// Texts of its cells; empty where there is nothing to say.

/** The time held, marked where it is not known: at least, at most, or about. */
std::string formatHeld(const day::DayRow& row);

/** The time with the display on of the time for which it is known; a dash if it is not. */
std::string formatDisplay(const day::DisplayTime& time);

/** The rate at which the sensor takes samples for `holder`, in Hz; "?" if its period is a guess. */
std::string formatHz(const day::Holder& holder, std::optional<int64_t> periodNs);

/** A batching period, as "200 ms". */
std::string formatBatch(std::optional<int64_t> us);

std::string formatWake(const day::Holder& holder);

/** A number of samples, as "950", "12.3k" or "1.2M". */
std::string formatSamples(std::optional<double> samples);

}  // namespace report
