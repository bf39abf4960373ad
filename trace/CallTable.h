#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
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
 * The library as a trace sees it: the calls and variables of calls.inc by their place there, and
 * the types that a trace gives for their parameters, taken from the library's declarations.
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

/** The name of a call, as a trace writes it. */
std::string_view callName(size_t index);

/** The place of the call or the variable of that name, if there is one. */
std::optional<size_t> findCall(std::string_view name);
std::optional<size_t> findVariable(std::string_view name);

/** The known call whose name is the nearest to `name`. */
std::string_view nearestCall(std::string_view name);

/** All calls, a line each, with the types of their arguments in brackets. */
std::string listCalls();

/** The library's counters: the budget of samples, the sample count, the six detect counts. */
using Counters = std::array<int32_t, 8>;

/** The entry points of the module that holds the library. */
struct CallModule {
    /** Makes call `index`; returns its result as JSON, if it has one. */
    std::optional<std::string> (*call)(size_t index, const std::vector<Argument>& arguments);

    /** Writes variable `index`; a `bool` takes 0 and 1. */
    void (*set)(size_t index, int32_t value);

    /** Looks at the counters; those of a module that does not exist yet are 0. */
    Counters (*counters)();
};

/** The one name that the module is asked for: a function that returns `const CallModule*`. */
inline constexpr char kCallModuleEntry[] = "sensor_replay_calls";

}  // namespace trace
