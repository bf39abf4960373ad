#include "day/Payload.h"

#include <algorithm>
#include <memory>
#include <optional>

#include <json/json.h>

namespace day {

using trace::EventForm;

namespace {

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

size_t countKeys(const EventForm& form) {
    const auto* end = std::find(form.keys.begin(), form.keys.end(), std::string_view());
    return static_cast<size_t>(end - form.keys.begin());
}

/** The values of `form`'s keys in `payload`; nothing if it has another form. */
std::optional<std::vector<std::string_view>> match(const EventForm& form,
                                                   std::string_view payload) {
    std::vector<std::string_view> values(countKeys(form));
    for (size_t i = values.size() - 1; i > form.freeKey; --i) {
        const std::string key = "&" + std::string(form.keys[i]) + ":";
        const size_t found = payload.rfind(key);
        if (found == std::string_view::npos) return std::nullopt;
        values[i] = payload.substr(found + key.size());
        payload = payload.substr(0, found);
    }
    for (size_t i = 0; i <= form.freeKey; ++i) {
        const std::string key = std::string(form.keys[i]) + ":";
        if (!startsWith(payload, key)) return std::nullopt;
        payload.remove_prefix(key.size());
        const size_t end = i == form.freeKey ? payload.size() : payload.find('&');
        if (end == std::string_view::npos) return std::nullopt;
        values[i] = payload.substr(0, end);
        payload.remove_prefix(std::min(end + 1, payload.size()));
    }
    return values;
}

Entry entryOf(const Json::Value& json) {
    Entry entry;
    for (const std::string& key : json.getMemberNames()) {
        entry.emplace_back(
                key, json[key].isString() ? json[key].asString() : json[key].toStyledString());
    }
    return entry;
}

/** A value that is a JSON object is a list if it has one, and an object of texts otherwise. */
Field makeField(std::string_view key, std::string_view text) {
    Field field{std::string(key), std::string(text), {}};
    if (!startsWith(text, "{")) return field;
    Json::Value json;
    const std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
    if (!reader->parse(text.data(), text.data() + text.size(), &json, nullptr)) return field;
    if (!json.isObject()) return field;
    if (json["list"].isArray()) {
        field.isList = true;
        for (const Json::Value& each : json["list"]) {
            if (each.isObject()) field.entries.push_back(entryOf(each));
        }
    } else {
        json.removeMember("list");
        field.entries.push_back(entryOf(json));
    }
    return field;
}

}  // namespace

Payload takeApart(std::string_view id, std::string_view payload) {
    Payload result;
    for (const EventForm& form : trace::kEventForms) {
        if (form.id != id) continue;
        const auto values = match(form, payload);
        if (!values) continue;
        result.kind = form.kind;
        for (size_t i = 0; i < values->size(); ++i) {
            result.fields.push_back(makeField(form.keys[i], (*values)[i]));
        }
        return result;
    }
    while (!payload.empty()) {
        const std::string_view pair = payload.substr(0, payload.find('&'));
        payload.remove_prefix(std::min(pair.size() + 1, payload.size()));
        const size_t colon = std::min(pair.find(':'), pair.size());
        result.fields.push_back(
                makeField(pair.substr(0, colon), pair.substr(std::min(colon + 1, pair.size()))));
    }
    return result;
}

std::string_view valueOf(const Entry& entry, std::string_view key) {
    const auto found = std::find_if(entry.begin(), entry.end(),
                                    [&](const auto& pair) { return pair.first == key; });
    return found == entry.end() ? std::string_view() : std::string_view(found->second);
}

}  // namespace day
