#include "report/EventText.h"

#include <algorithm>
#include <charconv>
#include <optional>
#include <string_view>

#include "report/Text.h"

namespace report {

namespace {

constexpr int64_t kNsPerSecond = 1'000'000'000;

enum class Kind { kText, kCount, kSeconds, kPeriod };

/** What stands behind a key, and its title in a list; in the order of a list's columns. */
constexpr struct {
    std::string_view key;
    std::string_view title;
    Kind kind;
} kValues[] = {
        {"pkg", "App", Kind::kText},
        {"rate", "Rate Hz", Kind::kPeriod},
        {"time", "Time", Kind::kSeconds},
        {"ontime", "Display on", Kind::kSeconds},
        {"totalTime", "Time", Kind::kSeconds},
        {"fastChargeTime", "Fast charging", Kind::kSeconds},
        {"usbChargeTime", "USB charging", Kind::kSeconds},
        {"otherChargeTime", "Other charging", Kind::kSeconds},
        {"shockAndChargeTime", "Shock and charge", Kind::kSeconds},
        {"lock", "Display locks", Kind::kCount},
        {"near", "Near", Kind::kCount},
};

constexpr std::pair<std::string_view, std::string_view> kUltraCodes[] = {
        {"100", "invalid route"},
        {"101", "invalid device"},
        {"102", "receiver closed"},
        {"103", "the day's calls"},
};

constexpr std::pair<std::string_view, std::string_view> kProperties[] = {
        {"persist.sys.ds_oriut", "orientation: days counted"},
        {"persist.sys.fc_oriut", "orientation: seconds, fast charging"},
        {"persist.sys.oc_oriut", "orientation: seconds, other charging"},
        {"persist.sys.sc_oriut", "orientation: seconds, shock and charge"},
        {"persist.sys.total_oriut", "orientation: seconds in all"},
        {"persist.sys.uc_oriut", "orientation: seconds, USB charging"},
        {"persist.zuno.device.invalid.count", "ultrasonic: invalid devices"},
        {"persist.zuno.flow.detect.count", "exceptions of each sensor family"},
        {"persist.zuno.rgb.shot.count", "screen samples"},
        {"persist.zuno.route.invalid.count", "ultrasonic: invalid routes"},
        {"persist.zuno.rx.close.count", "ultrasonic: receiver closures"},
        {"persist.zuno.ultra.enable.count", "ultrasonic: enables"},
        {"persist.zuno.ultra.invalid.count", "ultrasonic: calls that failed"},
        {"persist.zuno.ultra.phone.enable.count", "ultrasonic: calls"},
        {"persist.zuno.wechat.count.info", "chat calls: sessions_locked up_locks_near"},
};

template <size_t Size>
std::string_view lookUp(const std::pair<std::string_view, std::string_view> (&table)[Size],
                        std::string_view name) {
    const auto* found = std::find_if(std::begin(table), std::end(table),
                                     [&](const auto& each) { return each.first == name; });
    return found == std::end(table) ? std::string_view() : found->second;
}

/** `text` as its kind is shown; as it is, if it is no number. */
std::string show(Kind kind, const std::string& text) {
    int64_t number = 0;
    const char* const end = text.data() + text.size();
    const bool isNumber = std::from_chars(text.data(), end, number).ptr == end && !text.empty();
    if (!isNumber || number < 0 || kind == Kind::kText || kind == Kind::kCount) return text;
    return kind == Kind::kSeconds ? formatDuration(number * kNsPerSecond) : formatRate(number);
}

Kind kindOf(std::string_view key) {
    for (const auto& value : kValues) {
        if (value.key == key) return value.kind;
    }
    return Kind::kText;
}

Table layOutList(const Field& field, size_t limit) {
    std::vector<Table::Column> columns;
    std::vector<std::string_view> keys;
    for (const auto& [key, title, kind] : kValues) {
        const bool isThere = std::any_of(
                field.entries.begin(), field.entries.end(),
                [wanted = key](const Entry& entry) { return !valueOf(entry, wanted).empty(); });
        if (!isThere) continue;
        keys.push_back(key);
        columns.push_back({std::string(title),
                           kind == Kind::kText ? Table::Column::kCut : Table::Column::kRight});
    }
    Table table(columns, limit);
    for (const Entry& entry : field.entries) {
        std::vector<std::string> cells;
        for (const std::string_view key : keys) {
            const std::string text(valueOf(entry, key));
            cells.push_back(key == "pkg" ? shortenApp(text) : show(kindOf(key), text));
        }
        table.add(cells);
    }
    return table;
}

/** What a value says that is no list. */
std::string showPlain(const Field& field) {
    const std::string_view code =
            field.key == "ultraExpired" ? lookUp(kUltraCodes, field.text) : std::string_view();
    if (!code.empty()) return field.text + ", " + std::string(code);
    if (field.key == "pkg") return safe(shortenApp(field.text));
    if (field.entries.empty()) return safe(show(kindOf(field.key), field.text));
    std::string text;
    for (const auto& [key, value] : field.entries[0]) {
        text += (text.empty() ? "" : ", ") + key + ' ' + safe(value);
    }
    return text;
}

}  // namespace

std::string shortenApp(const std::string& app) {
    const size_t half = app.size() / 2;
    const bool isTwice = app.size() % 2 == 1 && app[half] == '/' &&
                         app.compare(0, half, app, half + 1, half) == 0;
    return isTwice ? app.substr(0, half) : app;
}

EventText layOut(const Event& event, size_t limit) {
    EventText text;
    text.title = formatTimeOfDay(event.at) + "  " + safe(event.id);
    const std::string_view meaning = describeEvent(event.id, event.fields);
    if (!meaning.empty()) text.title.append("  ").append(meaning);
    for (const Field& field : event.fields) {
        if (field.isList) {
            text.lists.push_back(layOutList(field, limit));
        } else {
            text.values.emplace_back(safe(describeKey(event.id, field.key)), showPlain(field));
        }
    }
    return text;
}

Table layOut(const std::map<std::string, std::string>& properties) {
    Table table({{"Property", Table::Column::kCut},
                 {"Value", Table::Column::kCut},
                 {"Meaning", Table::Column::kCut}},
                properties.size());
    for (const auto& [name, value] : properties) {
        table.add({name, value, std::string(lookUp(kProperties, name))});
    }
    return table;
}

}  // namespace report
