#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <simdjson.h>

#include "base/Json.h"

namespace trace {

/**
 * Reading a value out of parsed JSON: each `read` puts it into `*value`, or returns what is wrong
 * with it, worded to follow the value's name ("must be ...").
 */
using Error = std::optional<std::string>;

Error read(simdjson::dom::element json, bool* value);
Error read(simdjson::dom::element json, int32_t* value);
Error read(simdjson::dom::element json, int64_t* value);
Error read(simdjson::dom::element json, std::string* value);  // refuses a NUL
Error read(simdjson::dom::element json, std::vector<int32_t>* value);

template <size_t Size>
Error read(simdjson::dom::element json, std::array<int32_t, Size>* value) {
    simdjson::dom::array list;
    if (json.get(list) != simdjson::SUCCESS || list.size() != Size) {
        return "must be an array of " + std::to_string(Size) + " integers";
    }
    int32_t* next = value->data();
    for (const simdjson::dom::element item : list) {
        if (Error error = read(item, next++)) return "each element " + *error;
    }
    return {};
}

/** Why simdjson refuses `text`; a number too large for it is valid JSON all the same. */
std::string explain(simdjson::error_code status, std::string_view text);

/** Refuses an object in which a key stands twice: it means two things at once. */
Error checkKeys(simdjson::dom::object json);

}  // namespace trace
