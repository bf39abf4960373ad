#include "trace/CallTable.h"

#include <algorithm>
#include <iterator>

#include "base/Nearest.h"

namespace trace {

namespace {

// What a trace gives for each kind of argument, in words.

const char* describe(const bool*) {
    return "true or false";
}
const char* describe(const int32_t*) {
    return "integer";
}
const char* describe(const int64_t*) {
    return "integer of 64 bits";
}
const char* describe(const std::string*) {
    return "text";
}
const char* describe(const IntList*) {
    return "[integer, ...]";
}
const char* describe(const Rectangle*) {
    return "[left, top, right, bottom]";
}
const char* describe(const sensors_event_t*) {
    return R"({"type": integer, "data": [number, ...]})";
}
const char* describe(const android::UltraExceptionInfo*) {
    return R"({"packageName": text, "phoneState": integer})";
}

template <typename... Types>
std::string describeAll(const std::tuple<Types...>*) {
    std::string text;
    ((text.append(text.empty() ? "" : ", ").append(describe(static_cast<Types*>(nullptr)))), ...);
    return text;
}

template <typename Operation>
std::string describeArguments() {
    return describeAll(static_cast<typename ArgumentsOf<Operation>::type*>(nullptr));
}

struct NamedCall {
    std::string_view name;
    std::string (*arguments)();
};

constexpr NamedCall kCalls[] = {
#define CALL(Class, operation, parameters) \
    {#Class "." #operation, describeArguments<decltype(&android::Class::operation)>},
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

constexpr std::string_view kVariables[] = {
#define CALL(Class, operation, parameters)
#define VARIABLE(name) #name,
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

}  // namespace

std::string_view callName(size_t index) {
    return kCalls[index].name;
}

std::optional<size_t> findCall(std::string_view name) {
    const auto* found = std::find_if(std::begin(kCalls), std::end(kCalls),
                                     [&](const NamedCall& call) { return call.name == name; });
    if (found == std::end(kCalls)) return std::nullopt;
    return static_cast<size_t>(found - kCalls);
}

std::optional<size_t> findVariable(std::string_view name) {
    const auto* found = std::find(std::begin(kVariables), std::end(kVariables), name);
    if (found == std::end(kVariables)) return std::nullopt;
    return static_cast<size_t>(found - kVariables);
}

std::string_view nearestCall(std::string_view name) {
    std::vector<std::string_view> names;
    for (const NamedCall& call : kCalls) names.push_back(call.name);
    return base::nearest(name, names);
}

std::string listCalls() {
    std::string text;
    for (const NamedCall& call : kCalls) {
        text.append(call.name).append(" [").append(call.arguments()).append("]\n");
    }
    return text;
}

}  // namespace trace
