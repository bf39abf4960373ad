#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "trace/CallTable.h"
#include "trace/JsonReader.h"

namespace trace {

/**
 * Reads the arguments of call `index` from `json`, the array behind "args"; no array stands for an
 * empty one. An event gets `at`, in nanoseconds, as its timestamp.
 */
Error readArguments(size_t index, const std::optional<simdjson::dom::element>& json, int64_t at,
                    std::vector<Argument>* arguments);

/** Reads a value for variable `index`; `true` is 1. */
Error readVariable(size_t index, simdjson::dom::element json, int32_t* value);

}  // namespace trace
