#include "report/Payload.h"

#include <algorithm>
#include <iterator>
#include <memory>
#include <optional>

#include <json/json.h>

#include "trace/JsonText.h"

namespace report {

namespace {

struct Key {
    std::string_view name;
    std::string_view meaning;
};

/** An event's keys in the order of its payload; at most one of them holds a name from outside. */
struct Form {
    std::string_view id;
    std::string_view meaning;
    std::vector<Key> keys;
    size_t freeKey;  // of `keys`: the one whose value may hold anything
};

const std::vector<Form>& forms() {
    static const auto* const instance = new std::vector<Form>{
            {"N273|10003", "accelerometer: who used it", {{"app_list", "apps"}}, 0},
            {"N273|10004", "gyroscope: who used it", {{"app_list", "apps"}}, 0},
            {"N273|10003", "accelerometer: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10004", "gyroscope: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10005", "magnetic field: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10006", "light: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10007", "orientation: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10008", "rotation vector: exceptions", {{"reason", "exceptions"}}, 0},
            {"N273|10009", "screen samples of the day", {{"count", "samples"}}, 0},
            {"N273|10010",
             "long use of the proximity sensor",
             {{"pkg", "app"}, {"time", "held"}},
             0},
            {"N273|10011",
             "ultrasonic proximity",
             {{"TempInvalidRate", "failures/uses"},
              {"pkg", "app"},
              {"ultraEnergy", "background/fluctuant energy"},
              {"ultraExpired", "code"}},
             1},
            {"N273|10012", "orientation: who used it", {{"info", "apps"}}, 0},
            {"N273|10012",
             "orientation: totals since ever",
             {{"days", "days"},
              {"fastChargeTime", "fast charging"},
              {"otherChargeTime", "other charging"},
              {"pkg", "last app"},
              {"shockAndChargeTime", "shock and charge"},
              {"totalTime", "in all"},
              {"usbChargeTime", "USB charging"}},
             3},
            {"N273|10013", "chat call: proximity locked up", {{"variance", "spread of x/y/z"}}, 0},
            {"N273|10013",
             "chat calls of the day",
             {{"invalid", "locked up"}, {"status", "counts"}, {"total", "sessions"}},
             1},
    };
    return *instance;
}

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

/** The values of `form`'s keys in `payload`; nothing if it has another form. */
std::optional<std::vector<std::string_view>> match(const Form& form, std::string_view payload) {
    std::vector<std::string_view> values(form.keys.size());
    for (size_t i = form.keys.size() - 1; i > form.freeKey; --i) {
        const std::string key = "&" + std::string(form.keys[i].name) + ":";
        const size_t found = payload.rfind(key);
        if (found == std::string_view::npos) return std::nullopt;
        values[i] = payload.substr(found + key.size());
        payload = payload.substr(0, found);
    }
    for (size_t i = 0; i <= form.freeKey; ++i) {
        const std::string key = std::string(form.keys[i].name) + ":";
        if (!startsWith(payload, key)) return std::nullopt;
        payload.remove_prefix(key.size());
        const size_t end = i == form.freeKey ? payload.size() : payload.find('&');
        if (end == std::string_view::npos) return std::nullopt;
        values[i] = payload.substr(0, end);
        payload.remove_prefix(std::min(end + 1, payload.size()));
    }
    return values;
}

const Form* formOf(std::string_view id, const Fields& fields) {
    for (const Form& form : forms()) {
        if (form.id == id && !fields.empty() && form.keys[0].name == fields[0].key) return &form;
    }
    return nullptr;
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

std::string toJson(const Entry& entry) {
    std::string json;
    for (const auto& [key, value] : entry) {
        json += (json.empty() ? "{" : ", ") + trace::toJson(key) + ": " + trace::toJson(value);
    }
    return json.empty() ? "{}" : json + '}';
}

std::string valueToJson(const Field& field) {
    if (!field.isList)
        return field.entries.empty() ? trace::toJson(field.text) : toJson(field.entries[0]);
    std::string json;
    for (const Entry& entry : field.entries) json += (json.empty() ? "" : ", ") + toJson(entry);
    return '[' + json + ']';
}

}  // namespace

Fields takeApart(std::string_view id, std::string_view payload) {
    Fields fields;
    for (const Form& form : forms()) {
        if (form.id != id) continue;
        const auto values = match(form, payload);
        if (!values) continue;
        for (size_t i = 0; i < values->size(); ++i) {
            fields.push_back(makeField(form.keys[i].name, (*values)[i]));
        }
        return fields;
    }
    while (!payload.empty()) {
        const std::string_view pair = payload.substr(0, payload.find('&'));
        payload.remove_prefix(std::min(pair.size() + 1, payload.size()));
        const size_t colon = std::min(pair.find(':'), pair.size());
        fields.push_back(
                makeField(pair.substr(0, colon), pair.substr(std::min(colon + 1, pair.size()))));
    }
    return fields;
}

std::string toJson(const Fields& fields) {
    std::string json;
    for (const Field& field : fields) {
        json += (json.empty() ? "{" : ", ") + trace::toJson(field.key) + ": " + valueToJson(field);
    }
    return json.empty() ? "{}" : json + '}';
}

std::string_view describeEvent(std::string_view id, const Fields& fields) {
    const Form* form = formOf(id, fields);
    return form == nullptr ? std::string_view() : form->meaning;
}

std::string_view describeKey(std::string_view id, std::string_view key) {
    for (const Form& form : forms()) {
        if (form.id != id) continue;
        for (const Key& each : form.keys) {
            if (each.name == key) return each.meaning;
        }
    }
    return key;
}

std::string_view valueOf(const Entry& entry, std::string_view key) {
    const auto found = std::find_if(entry.begin(), entry.end(),
                                    [&](const auto& pair) { return pair.first == key; });
    return found == entry.end() ? std::string_view() : std::string_view(found->second);
}

const Field* find(const Fields& fields, std::string_view key) {
    const auto found = std::find_if(fields.begin(), fields.end(),
                                    [&](const Field& field) { return field.key == key; });
    return found == fields.end() ? nullptr : &*found;
}

}  // namespace report
