#include "trace/TraceLine.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <limits>
#include <type_traits>

#include "platform/PropertyService.h"
#include "trace/JsonText.h"
#include "trace/LineReader.h"
#include "trace/TraceTime.h"

namespace trace {

namespace {

using simdjson::dom::array;
using simdjson::dom::element;
using simdjson::dom::object;
using Error = std::optional<std::string>;

/** 285 years; the clock and every wait that the Looper can ask for still fit 63 bits. */
constexpr int64_t kMaxTimeMs = 9'000'000'000'000;
constexpr int64_t kDecimals = 6;    // of a millisecond
constexpr int64_t kMaxDigits = 19;  // of a time in nanoseconds

/** A key that stands twice means two things at once. */
Error checkKeys(object json) {
    for (auto field = json.begin(); field != json.end(); ++field) {
        for (auto other = json.begin(); other != field; ++other) {
            if (field.key() == other.key()) return "the key " + toJson(field.key()) + " twice";
        }
    }
    return {};
}

// One reader for each kind of argument.

Error read(element json, bool* value) {
    return json.get(*value) == simdjson::SUCCESS ? Error() : "must be true or false";
}

Error read(element json, int64_t* value) {
    return json.get(*value) == simdjson::SUCCESS ? Error() : "must be an integer of 64 bits";
}

Error read(element json, int32_t* value) {
    int64_t wide = 0;
    if (json.get(wide) != simdjson::SUCCESS || wide != static_cast<int32_t>(wide)) {
        return "must be an integer of 32 bits";
    }
    *value = static_cast<int32_t>(wide);
    return {};
}

Error read(element json, std::string* value) {
    std::string_view text;
    if (json.get(text) != simdjson::SUCCESS) return "must be a text";
    if (text.find('\0') != std::string_view::npos) return "must be a text without NUL";
    value->assign(text);
    return {};
}

template <size_t Size>
Error read(element json, std::array<int32_t, Size>* value) {
    array list;
    if (json.get(list) != simdjson::SUCCESS || list.size() != Size) {
        return "must be an array of " + std::to_string(Size) + " integers";
    }
    int32_t* next = value->data();
    for (const element item : list) {
        if (Error error = read(item, next++)) return "each element " + *error;
    }
    return {};
}

Error read(element json, IntList* value) {
    array list;
    if (json.get(list) != simdjson::SUCCESS) return "must be an array of integers";
    for (const element item : list) {
        if (Error error = read(item, &value->emplace_back())) return "each element " + *error;
    }
    return {};
}

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
    if (Error error = read(type, &event->type)) return R"("type" )" + *error;
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
        if (key == "packageName") error = read(value, &info->packageName);
        if (key == "phoneState") error = read(value, &info->phoneState);
        if (error) return toJson(key) + ' ' + *error;
    }
    return {};
}

/** A call or a variable as a trace names it, and how to read what belongs to it. */
struct Call {
    std::string_view name;
    size_t count;
    Error (*readArgument)(size_t index, element json, int64_t at, Argument* argument);
};

struct Variable {
    std::string_view name;
    Error (*readValue)(element json, int32_t* value);
};

template <typename T>
Error readAlternative(element json, int64_t at, Argument* argument) {
    T value{};
    if constexpr (std::is_same_v<T, sensors_event_t>) value.timestamp = at;
    Error error = read(json, &value);
    *argument = std::move(value);
    return error;
}

template <typename Arguments>
struct ReaderOf;
template <typename... Types>
struct ReaderOf<std::tuple<Types...>> {
    static Error readArgument(size_t index, element json, int64_t at, Argument* argument) {
        constexpr std::array<Error (*)(element, int64_t, Argument*), sizeof...(Types) + 1> kReaders{
                readAlternative<Types>..., nullptr};
        return kReaders[index](json, at, argument);
    }
};

template <typename Operation>
constexpr Call describeCall(std::string_view name) {
    using Arguments = typename ArgumentsOf<Operation>::type;
    return {name, std::tuple_size_v<Arguments>, ReaderOf<Arguments>::readArgument};
}

template <typename Type>
Error readVariable(element json, int32_t* value) {
    Type typed{};
    Error error = read(json, &typed);
    *value = static_cast<int32_t>(typed);
    return error;
}

constexpr Call kCalls[] = {
#define CALL(Class, operation) \
    describeCall<decltype(&android::Class::operation)>(#Class "." #operation),
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

constexpr Variable kVariables[] = {
#define CALL(Class, operation)
#define VARIABLE(name) {#name, readVariable<decltype(::name)>},
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
};

template <typename Entry, size_t Size>
std::optional<size_t> indexOf(const Entry (&table)[Size], std::string_view name) {
    const auto* found = std::find_if(std::begin(table), std::end(table),
                                     [&](const Entry& entry) { return entry.name == name; });
    if (found == std::end(table)) return std::nullopt;
    return static_cast<size_t>(found - table);
}

/** The JSON number `token`, in milliseconds, as nanoseconds; nothing if it has none. */
std::optional<int64_t> toNanoseconds(std::string_view token) {
    // Digit by digit: a double does not hold the nanoseconds of a year.
    std::string digits;
    int64_t exponent = kDecimals;  // the time is `digits` times ten to this
    size_t i = 0;
    for (bool fraction = false; i < token.size() && std::strchr("-.0123456789", token[i]); ++i) {
        if (token[i] == '.') fraction = true;
        if (token[i] < '0') continue;
        if (token[i] != '0' || !digits.empty()) digits += token[i];
        if (fraction) --exponent;
    }
    if (digits.empty()) return 0;
    if (token.front() == '-') return std::nullopt;
    if (i < token.size()) {  // an exponent, or blanks, which read as 0
        const std::string rest(token.substr(i + 1));
        exponent += std::clamp(std::strtol(rest.c_str(), nullptr, 10), -1000L, 1000L);
    }
    for (; digits.back() == '0'; ++exponent) digits.pop_back();
    if (exponent < 0 || static_cast<int64_t>(digits.size()) + exponent > kMaxDigits) {
        return std::nullopt;
    }
    digits.append(static_cast<size_t>(exponent), '0');
    const int64_t time = std::strtoll(digits.c_str(), nullptr, 10);
    return time <= kMaxTimeMs * kNsPerMs ? std::optional(time) : std::nullopt;
}

/** The number that stands behind "at" in `text`, a valid JSON object, as it is written there. */
std::string_view atToken(simdjson::ondemand::parser* parser, std::string_view text) {
    auto document = parser->iterate(text.data(), text.size(), text.size() + LineReader::kPadding);
    for (auto field : document.get_object()) {
        std::string_view key;
        if (field.unescaped_key().get(key) != simdjson::SUCCESS) break;
        if (key == "at") return field.value().raw_json_token();
    }
    return {};
}

Error readCall(element json, TraceLine* line) {
    std::string_view name;
    if (json.get(name) != simdjson::SUCCESS) return R"("call" must be a text)";
    const std::optional<size_t> index = indexOf(kCalls, name);
    if (!index) return "unknown call " + toJson(name);
    line->action = TraceLine::Action::kCall;
    line->call = *index;
    return {};
}

/** Reads the arguments of `line->call`; none if there is no `json`. */
Error readArguments(const std::optional<element>& json, TraceLine* line) {
    const Call& call = kCalls[line->call];
    array values;
    if (json && json->get(values) != simdjson::SUCCESS) return R"("args" must be an array)";
    const size_t given = json ? values.size() : 0;
    if (given != call.count) {
        return std::string(call.name) + " takes " + std::to_string(call.count) +
               " arguments, not " + std::to_string(given);
    }
    line->arguments.resize(call.count);
    size_t index = 0;
    if (!json) return {};
    for (const element value : values) {
        if (Error error = call.readArgument(index, value, line->at, &line->arguments[index])) {
            return "argument " + std::to_string(index + 1) + " of " + std::string(call.name) + ' ' +
                   *error;
        }
        ++index;
    }
    return {};
}

Error readVariables(element json, TraceLine* line) {
    line->action = TraceLine::Action::kSet;
    line->variables.clear();
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("set" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [name, value] : values) {
        const std::optional<size_t> index = indexOf(kVariables, name);
        if (!index) return "unknown variable " + toJson(name);
        auto& variable = line->variables.emplace_back(*index, 0);
        if (Error error = kVariables[*index].readValue(value, &variable.second)) {
            return toJson(name) + ' ' + *error;
        }
    }
    return {};
}

Error readProperties(element json, TraceLine* line) {
    line->action = TraceLine::Action::kProperty;
    line->properties.clear();
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("property" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [name, value] : values) {
        auto& property = line->properties.emplace_back(name, std::nullopt);
        if (name.find('\0') != std::string_view::npos) return "a property's name holds a NUL";
        if (!value.is_null()) {
            if (Error error = read(value, &property.second.emplace())) {
                return toJson(name) + ' ' + *error + " or null";
            }
        }
        if (Error error = platform::refuseProperty(property.first, property.second.value_or(""))) {
            return toJson(name) + ": " + *error;
        }
    }
    return {};
}

template <size_t Size>
Error checkRange(const std::array<int32_t, Size>& values, int32_t min, int32_t max) {
    for (const int32_t value : values) {
        if (value < min || value > max) {
            return "must lie from " + std::to_string(min) + " to " + std::to_string(max);
        }
    }
    return {};
}

Error readSize(element json, platform::DisplaySize* size) {
    std::array<int32_t, 2> sides{};
    if (Error error = read(json, &sides)) return error;
    *size = {static_cast<uint32_t>(sides[0]), static_cast<uint32_t>(sides[1])};
    return checkRange(sides, 1, std::numeric_limits<int32_t>::max());
}

Error readColor(element json, platform::Color* color) {
    std::array<int32_t, 3> rgb{};
    if (Error error = read(json, &rgb)) return error;
    *color = {static_cast<uint8_t>(rgb[0]), static_cast<uint8_t>(rgb[1]),
              static_cast<uint8_t>(rgb[2])};
    return checkRange(rgb, 0, 255);
}

Error readRowPadding(element json, uint32_t* pixels) {
    std::array<int32_t, 1> value{};
    if (Error error = read(json, value.data())) return error;
    *pixels = static_cast<uint32_t>(value[0]);
    return checkRange(value, 0, platform::Picture::kMaxSide);
}

Error readPicture(element json, const std::string& trace, platform::Picture* picture) {
    std::string path;
    if (Error error = read(json, &path)) return error;
    // An absolute path stands for itself; standard input, "-", is beside the current directory.
    const auto file = std::filesystem::path(trace).parent_path() / path;
    if (Error error = platform::readPng(file, picture)) return toJson(path) + ": " + *error;
    return {};
}

Error readFault(element json, platform::DisplayFault* fault) {
    constexpr std::pair<std::string_view, platform::DisplayFault> kFaults[] = {
            {"token", platform::DisplayFault::kToken},
            {"capture", platform::DisplayFault::kCapture},
            {"results", platform::DisplayFault::kResults},
            {"lock", platform::DisplayFault::kLock},
    };
    *fault = platform::DisplayFault::kNone;
    if (json.is_null()) return {};
    std::string_view name;
    if (json.get(name) == simdjson::SUCCESS) {
        for (const auto& [known, value] : kFaults) {
            if (name == known) *fault = value;
        }
    }
    if (*fault != platform::DisplayFault::kNone) return {};
    return R"(must be "token", "capture", "results", "lock" or null)";
}

Error readDisplay(element json, const std::string& trace, TraceLine* line) {
    line->action = TraceLine::Action::kDisplay;
    platform::DisplayChange& change = line->display;
    change = {};
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("display" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [key, value] : values) {
        Error error;
        if (key == "size") {
            error = readSize(value, &change.size.emplace());
        } else if (key == "color") {
            error = readColor(value, &change.color.emplace());
        } else if (key == "png") {
            error = readPicture(value, trace, &change.picture.emplace());
        } else if (key == "rowPadding") {
            error = readRowPadding(value, &change.rowPadding.emplace());
        } else if (key == "fault") {
            error = readFault(value, &change.fault.emplace());
        } else {
            return "unknown key " + toJson(key);
        }
        if (error) return toJson(key) + ' ' + *error;
    }
    if (change.picture && (change.size || change.color)) {
        return R"("png" together with "size" or "color")";
    }
    return {};
}

Error readBoot(element json, TraceLine* line) {
    line->action = TraceLine::Action::kBoot;
    std::string_view kind;
    if (json.get(kind) == simdjson::SUCCESS && kind == "device") {
        line->boot = BootKind::kDevice;
    } else if (json.get(kind) == simdjson::SUCCESS && kind == "process") {
        line->boot = BootKind::kProcess;
    } else {
        return R"("boot" must be "device" or "process")";
    }
    return {};
}

}  // namespace

std::string_view callName(size_t index) {
    return kCalls[index].name;
}

std::optional<std::string> TraceParser::parse(std::string_view text, const std::string& trace,
                                              TraceLine* line) {
    static_assert(LineReader::kPadding >= simdjson::SIMDJSON_PADDING);
    element document;
    object fields;
    const auto status = mParser.parse(text.data(), text.size(), false).get(document);
    if (status != simdjson::SUCCESS) {
        return std::string("not valid JSON: ") + simdjson::error_message(status);
    }
    if (document.get(fields) != simdjson::SUCCESS) return "not a JSON object";
    if (Error error = checkKeys(fields)) return error;

    line->action = TraceLine::Action::kNone;
    std::optional<element> at;
    std::optional<element> arguments;
    int actions = 0;
    Error error;
    for (const auto [key, value] : fields) {
        if (key == "at") {
            at = value;
        } else if (key == "args") {
            arguments = value;
        } else {
            ++actions;
            if (key == "call") {
                error = readCall(value, line);
            } else if (key == "set") {
                error = readVariables(value, line);
            } else if (key == "property") {
                error = readProperties(value, line);
            } else if (key == "display") {
                error = readDisplay(value, trace, line);
            } else if (key == "boot") {
                error = readBoot(value, line);
            } else {
                error = "unknown key " + toJson(key);
            }
        }
        if (error) return error;
    }
    if (actions > 1) return "more than one action";
    if (!at) return R"("at" is missing)";

    std::optional<int64_t> time;
    if (int64_t ms = 0; at->get(ms) == simdjson::SUCCESS) {
        if (ms >= 0 && ms <= kMaxTimeMs) time = ms * kNsPerMs;
    } else if (at->is_number()) {
        // The document tree rounds fractions to double; the text has them exactly.
        time = toNanoseconds(atToken(&mNumberParser, text));
    }
    if (!time) return R"("at" must be a number of at most six decimals, from 0 to 9e12)";
    line->at = *time;

    if (line->action == TraceLine::Action::kCall) return readArguments(arguments, line);
    if (arguments) return R"("args" without a call)";
    return {};
}

bool isSkipped(std::string_view text) {
    const size_t first = text.find_first_not_of(" \t\r");
    return first == std::string_view::npos || text[first] == '#';
}

}  // namespace trace
