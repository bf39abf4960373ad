#include "trace/TraceLine.h"

#include <algorithm>
#include <array>

#include "base/Json.h"
#include "base/LineReader.h"
#include "platform/PropertyService.h"
#include "trace/Arguments.h"
#include "trace/DisplayLine.h"
#include "trace/JsonReader.h"
#include "trace/TraceTime.h"
#include "trace/TraceWriter.h"

namespace trace {

using simdjson::dom::element;
using simdjson::dom::object;

struct TraceParser::Parsers {
    simdjson::dom::parser document;
    simdjson::ondemand::parser numbers;
};

namespace {

/** The number behind "at" in `text`, a valid JSON object, as it is written there. */
std::string_view atToken(simdjson::ondemand::parser* parser, std::string_view text) {
    auto document =
            parser->iterate(text.data(), text.size(), text.size() + base::LineReader::kPadding);
    for (auto field : document.get_object()) {
        std::string_view key;
        if (field.unescaped_key().get(key) != simdjson::SUCCESS) break;
        if (key == "at") return field.value().raw_json_token();
    }
    return {};
}

Error readTime(element json, simdjson::ondemand::parser* parser, std::string_view text,
               int64_t* time) {
    std::optional<int64_t> ns;
    if (int64_t ms = 0; json.get(ms) == simdjson::SUCCESS) {
        if (ms >= 0 && ms <= kMaxTimeMs) ns = ms * kNsPerMs;
    } else if (json.is_number()) {
        // The document tree rounds fractions to double; the text has them exactly.
        ns = parseMs(atToken(parser, text));
    }
    if (!ns) return R"("at" must be a number of at most six decimals, from 0 to 9e12)";
    *time = *ns;
    return {};
}

Error readCall(element json, Call* call) {
    std::string_view name;
    if (json.get(name) != simdjson::SUCCESS) return R"("call" must be a text)";
    const std::optional<size_t> index = findCall(name);
    if (!index) {
        return "unknown call " + base::quote(name) + "; the nearest is " +
               base::toJson(nearestCall(name));
    }
    call->index = *index;
    return {};
}

Error readVariables(element json, VariableWrites* variables) {
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("set" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [name, value] : values) {
        const std::optional<size_t> index = findVariable(name);
        if (!index) return "unknown variable " + base::quote(name);
        auto& write = variables->writes.emplace_back(*index, 0);
        if (Error error = readVariable(*index, value, &write.second)) {
            return base::quote(name) + ' ' + *error;
        }
    }
    return {};
}

Error readProperties(element json, PropertyWrites* properties) {
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("property" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [name, value] : values) {
        auto& write = properties->writes.emplace_back(name, std::nullopt);
        if (name.find('\0') != std::string_view::npos) return "a property's name holds a NUL";
        if (!value.is_null()) {
            if (Error error = read(value, &write.second.emplace())) {
                return base::quote(name) + ' ' + *error + " or null";
            }
        }
        if (Error error = platform::refuseProperty(write.first, write.second.value_or(""))) {
            return base::quote(name) + ": " + *error;
        }
    }
    return {};
}

/** Reads an object that has a text behind each of `keys`; `ignored` may be there as well. */
template <size_t Size>
Error readTexts(element json, const std::array<std::string_view, Size>& keys,
                std::array<std::string, Size>* texts, std::string_view ignored = {}) {
    object values;
    if (json.get(values) != simdjson::SUCCESS) return "must be an object";
    if (Error error = checkKeys(values)) return "has " + *error;
    size_t found = 0;
    for (const auto [key, value] : values) {
        if (!ignored.empty() && key == ignored) continue;
        const auto place =
                static_cast<size_t>(std::find(keys.begin(), keys.end(), key) - keys.begin());
        if (place == Size) return "has the unknown key " + base::quote(key);
        if (Error error = read(value, &(*texts)[place])) return base::quote(key) + ' ' + *error;
        ++found;
    }
    return found == Size ? Error() : "lacks a key";
}

Error readExpectation(element json, Expectation* expectation) {
    constexpr std::string_view kEvent = "event";
    constexpr std::string_view kProperty = "property";
    object values;
    if (json.get(values) != simdjson::SUCCESS || values.size() != 1) {
        return R"("expect" must be an object with "event" or "property")";
    }
    const auto [kind, value] = *values.begin();
    if (kind == kEvent) {
        std::array<std::string, 3> texts;
        if (Error error = readTexts<3>(value, {"module", "id", "payload"}, &texts, "fields")) {
            return R"("event" )" + *error;
        }
        expectation->entry = eventEntry(texts[0], texts[1], texts[2]);
    } else if (kind == kProperty) {
        std::array<std::string, 2> texts;
        if (Error error = readTexts<2>(value, {"name", "value"}, &texts)) {
            return R"("property" )" + *error;
        }
        expectation->entry = propertyEntry(texts[0], texts[1]);
    } else {
        return R"("expect" has the unknown key )" + base::quote(kind);
    }
    return {};
}

Error readBoot(element json, BootKind* boot) {
    std::string_view name;
    const bool isText = json.get(name) == simdjson::SUCCESS;
    const auto* found = std::find(kBootKinds.begin(), kBootKinds.end(), name);
    if (!isText || found == kBootKinds.end()) return R"("boot" must be "device" or "process")";
    *boot = static_cast<BootKind>(found - kBootKinds.begin());
    return {};
}

/** Reads the action that stands behind `key`. */
Error readAction(std::string_view key, element value, const std::string& trace, TraceLine* line) {
    auto& action = line->action;
    if (key == "call") return readCall(value, &action.emplace<Call>());
    if (key == "set") return readVariables(value, &action.emplace<VariableWrites>());
    if (key == "property") return readProperties(value, &action.emplace<PropertyWrites>());
    if (key == "display") {
        return readDisplay(value, trace, &action.emplace<platform::DisplayChange>());
    }
    if (key == "expect") return readExpectation(value, &action.emplace<Expectation>());
    if (key == "boot") return readBoot(value, &action.emplace<BootKind>());
    return "unknown key " + base::quote(key);
}

}  // namespace

TraceParser::TraceParser() : mParsers(std::make_unique<Parsers>()) {}

TraceParser::~TraceParser() = default;

std::optional<std::string> TraceParser::parse(std::string_view text, const std::string& trace,
                                              TraceLine* line) {
    static_assert(base::LineReader::kPadding >= simdjson::SIMDJSON_PADDING);
    element document;
    object fields;
    const auto status = mParsers->document.parse(text.data(), text.size(), false).get(document);
    if (status != simdjson::SUCCESS) return explain(status, text);
    if (document.get(fields) != simdjson::SUCCESS) return "not a JSON object";
    if (Error error = checkKeys(fields)) return error;

    line->action = std::monostate();
    line->note.clear();
    std::optional<element> at;
    std::optional<element> arguments;
    for (const auto [key, value] : fields) {
        if (key == "at") {
            at = value;
        } else if (key == "args") {
            arguments = value;
        } else if (key == "note") {
            if (!value.is_object()) return R"("note" must be an object)";
            line->note = simdjson::minify(value);
        } else if (Error error = readAction(key, value, trace, line)) {
            return error;
        }
    }
    const size_t others = (at ? 1 : 0) + (arguments ? 1 : 0) + (line->note.empty() ? 0 : 1);
    if (fields.size() > 1 + others) return "more than one action";
    if (!at) return R"("at" is missing)";
    if (Error error = readTime(*at, &mParsers->numbers, text, &line->at)) return error;
    if (auto* call = std::get_if<Call>(&line->action)) {
        return readArguments(call->index, arguments, line->at, &call->arguments);
    }
    if (arguments) return R"("args" without a call)";
    return {};
}

bool isSkipped(std::string_view text) {
    const size_t first = text.find_first_not_of(" \t\r");
    return first == std::string_view::npos || text[first] == '#';
}

}  // namespace trace
