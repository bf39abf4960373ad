#pragma once

#include <algorithm>
#include <cstdint>
#include <optional>

#include "day/Use.h"
#include "trace/Words.h"

namespace day {

/**
 * Whether the sensor takes samples all the time. The device's list says it, else the type, which
 * binds the sensors of the platform.
 */
inline bool isContinuous(const Holder& holder) {
    if (holder.mode != trace::SensorMode::kUnknown) {
        return holder.mode == trace::SensorMode::kContinuous;
    }
    return trace::isContinuousType(holder.type);
}

/**
 * The rate, in Hz, at which the sensor takes samples for `holder`: as it was asked for, but no more
 * than the sensor can, which is also what a period of 0 asks for. Nothing if that is not known, or
 * if there is none: a one-shot sensor has no rate.
 */
inline std::optional<double> rateOf(const Holder& holder, std::optional<int64_t> periodNs) {
    const double most = holder.maxRate.value_or(0);
    if (holder.mode == trace::SensorMode::kOneShot || !(most > 0) || !periodNs) return {};
    return *periodNs <= 0 ? most : std::min(1e9 / static_cast<double>(*periodNs), most);
}

/**
 * The samples of a use, or of a part of it that takes `timeNs`. Nothing if its rate is not known,
 * or if the sensor does not take samples all the time.
 */
inline std::optional<double> samplesOf(const Use& use, int64_t timeNs) {
    const auto rate = rateOf(use, use.periodNs);
    if (!rate || !isContinuous(use)) return {};
    return *rate * static_cast<double>(timeNs) / 1e9;
}

inline std::optional<double> samplesOf(const Use& use) {
    return samplesOf(use, use.to - use.from);
}

}  // namespace day
