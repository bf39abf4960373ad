#include "trace/CallTable.h"

#include <algorithm>
#include <iterator>
#include <numeric>

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

struct Call {
    std::string_view name;
    std::string (*arguments)();
};

constexpr Call kCalls[] = {
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

/** How many characters have to be put in, left out or replaced to make `b` of `a`. */
size_t distance(std::string_view a, std::string_view b) {
    std::vector<size_t> row(b.size() + 1);  // of the prefix of `a` so far to each prefix of `b`
    std::iota(row.begin(), row.end(), size_t{0});
    for (size_t i = 0; i < a.size(); ++i) {
        size_t diagonal = row[0]++;
        for (size_t j = 0; j < b.size(); ++j) {
            const size_t replaced = diagonal + (a[i] == b[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({replaced, diagonal + 1, row[j] + 1});
        }
    }
    return row.back();
}

}  // namespace

std::string_view callName(size_t index) {
    return kCalls[index].name;
}

std::optional<size_t> findCall(std::string_view name) {
    const auto* found = std::find_if(std::begin(kCalls), std::end(kCalls),
                                     [&](const Call& call) { return call.name == name; });
    if (found == std::end(kCalls)) return std::nullopt;
    return static_cast<size_t>(found - kCalls);
}

std::optional<size_t> findVariable(std::string_view name) {
    const auto* found = std::find(std::begin(kVariables), std::end(kVariables), name);
    if (found == std::end(kVariables)) return std::nullopt;
    return static_cast<size_t>(found - kVariables);
}

std::string_view nearestCall(std::string_view name) {
    constexpr size_t kLongest = 100;  // of a name that is worth a comparison
    name = name.substr(0, kLongest);
    return std::min_element(std::begin(kCalls), std::end(kCalls),
                            [&](const Call& a, const Call& b) {
                                return distance(name, a.name) < distance(name, b.name);
                            })
            ->name;
}

std::string listCalls() {
    std::string text;
    for (const Call& call : kCalls) {
        text.append(call.name).append(" [").append(call.arguments()).append("]\n");
    }
    return text;
}

}  // namespace trace
