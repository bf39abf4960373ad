#include "trace/Arguments.h"

#include <array>
#include <iterator>
#include <type_traits>
#include <utility>

#include "base/Json.h"

namespace trace {

using simdjson::dom::array;
using simdjson::dom::element;
using simdjson::dom::object;

namespace {

Error read(element json, sensors_event_t* event) {
    object fields;
    if (json.get(fields) != simdjson::SUCCESS) return "must be an event";
    element type;
    element data;
    array numbers;
    if (fields.size() != 2 || fields["type"].get(type) != simdjson::SUCCESS ||
        fields["data"].get(data) != simdjson::SUCCESS) {
        return R"(must be an event with "type" and "data")";
    }
    if (Error error = trace::read(type, &event->type)) return R"("type" )" + *error;
    if (data.get(numbers) != simdjson::SUCCESS || numbers.size() > std::size(event->data)) {
        return R"("data" must be an array of at most 16 numbers)";
    }
    float* next = event->data;
    for (const element item : numbers) {
        double number = 0;
        if (item.get(number) != simdjson::SUCCESS) return R"("data" must hold numbers)";
        *next++ = static_cast<float>(number);
    }
    return {};
}

Error read(element json, android::UltraExceptionInfo* info) {
    object fields;
    if (json.get(fields) != simdjson::SUCCESS) return "must be an object";
    if (Error error = checkKeys(fields)) return "has " + *error;
    for (const auto [key, value] : fields) {
        Error error = "is unknown";
        if (key == "packageName") error = trace::read(value, &info->packageName);
        if (key == "phoneState") error = trace::read(value, &info->phoneState);
        if (error) return base::quote(key) + ' ' + *error;
    }
    return {};
}

using trace::read;

template <typename T>
Error readAlternative(element json, int64_t at, Argument* argument) {
    T value{};
    if constexpr (std::is_same_v<T, sensors_event_t>) value.timestamp = at;
    Error error = read(json, &value);
    *argument = std::move(value);
    return error;
}

/** How to read each argument of a call. */
struct Readers {
    size_t count;
    Error (*read)(size_t index, element json, int64_t at, Argument* argument);
};

template <typename Arguments>
struct ReadersOf;
template <typename... Types>
struct ReadersOf<std::tuple<Types...>> {
    static Error read(size_t index, element json, int64_t at, Argument* argument) {
        constexpr std::array<Error (*)(element, int64_t, Argument*), sizeof...(Types) + 1> kEach{
                readAlternative<Types>..., nullptr};
        return kEach[index](json, at, argument);
    }
    static constexpr Readers kAll{sizeof...(Types), read};
};

constexpr Readers kCallReaders[] = {
#define CALL(Class, operation, parameters) \
    ReadersOf<typename ArgumentsOf<decltype(&android::Class::operation)>::type>::kAll,
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

template <typename Type>
Error readTyped(element json, int32_t* value) {
    Type typed{};
    Error error = read(json, &typed);
    *value = static_cast<int32_t>(typed);
    return error;
}

constexpr Error (*kVariableReaders[])(element, int32_t*) = {
#define CALL(Class, operation, parameters)
#define VARIABLE(name) readTyped<decltype(::name)>,
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

}  // namespace

Error readArguments(size_t index, const std::optional<element>& json, int64_t at,
                    std::vector<Argument>* arguments) {
    const Readers& readers = kCallReaders[index];
    const std::string_view name = callName(index);
    array values;
    if (json && json->get(values) != simdjson::SUCCESS) return R"("args" must be an array)";
    const size_t given = json ? values.size() : 0;
    if (given != readers.count) {
        return std::string(name) + " takes " + std::to_string(readers.count) + " arguments, not " +
               std::to_string(given);
    }
    arguments->resize(given);
    if (given == 0) return {};
    size_t i = 0;
    for (const element value : values) {
        if (Error error = readers.read(i, value, at, &(*arguments)[i])) {
            return "argument " + std::to_string(i + 1) + " of " + std::string(name) + ' ' + *error;
        }
        ++i;
    }
    return {};
}

Error readVariable(size_t index, element json, int32_t* value) {
    return kVariableReaders[index](json, value);
}

}  // namespace trace
