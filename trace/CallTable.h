#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <tuple>
#include <variant>
#include <vector>

#include <hardware/sensors.h>
#include <utils/String8.h>
#include <utils/Vector.h>

#include "core/Log.h"
#include "core/SDCImpl.h"
#include "exception/FlowingDataException.h"
#include "exception/UltraException.h"
#include "rgb/LightSensorState.h"
#include "rgb/RgbShotManager.h"

/**
 * The library as a trace sees it: calls and variables by their place in calls.inc. The tool
 * itself is not linked with the library; it loads it when a process first needs it, so that the
 * library's static initialisers run then.
 */
namespace trace {

using IntList = std::vector<int32_t>;
using Rectangle = std::array<int32_t, 4>;  // left, top, right, bottom

/** One argument of a call, as a trace gives it. */
using Argument = std::variant<bool, int32_t, int64_t, std::string, IntList, Rectangle,
                              sensors_event_t, android::UltraExceptionInfo>;

/** What a trace has to give for a parameter of type `T`. */
template <typename T>
struct ArgumentFor {
    using type = T;
};
template <>
struct ArgumentFor<long long> {
    using type = int64_t;
};
template <>
struct ArgumentFor<android::String8> {
    using type = std::string;
};
template <>
struct ArgumentFor<android::Vector<int>> {
    using type = IntList;
};

/** The arguments that a trace gives for an operation, as a tuple of the alternatives' types. */
template <typename Operation>
struct ArgumentsOf;
template <typename Class, typename Result, typename... Parameters>
struct ArgumentsOf<Result (Class::*)(Parameters...)> {
    using type = std::tuple<typename ArgumentFor<std::decay_t<Parameters>>::type...>;
};
template <typename Class>
struct ArgumentsOf<int (Class::*)(int* rgbOut, int* rect)> {
    using type = std::tuple<Rectangle>;
};
template <typename Result>
struct ArgumentsOf<Result (*)()> {
    using type = std::tuple<>;
};

/** The loaded library. */
struct Calls {
    /** Makes call `index`; returns its result as JSON, if it has one. */
    std::optional<std::string> (*call)(size_t index, const std::vector<Argument>& arguments);

    /** Writes variable `index`; a `bool` takes 0 and 1. */
    void (*set)(size_t index, int32_t value);
};

/** The one name that the loaded module is asked for: a function that returns `const Calls*`. */
inline constexpr char kCallsEntry[] = "sensor_replay_calls";

}  // namespace trace
