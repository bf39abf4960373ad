#include "report/EventText.h"

#include <algorithm>
#include <charconv>
#include <optional>
#include <string_view>

#include "base/Calendar.h"
#include "report/Format.h"
#include "report/Text.h"

namespace report {

using day::Entry;
using day::Field;
using trace::EventKind;
using trace::Property;

namespace {

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

constexpr std::pair<EventKind, std::string_view> kEvents[] = {
        {EventKind::kAccelerometerApps, "accelerometer: who used it"},
        {EventKind::kGyroscopeApps, "gyroscope: who used it"},
        {EventKind::kAccelerometerExceptions, "accelerometer: exceptions"},
        {EventKind::kGyroscopeExceptions, "gyroscope: exceptions"},
        {EventKind::kMagneticFieldExceptions, "magnetic field: exceptions"},
        {EventKind::kLightExceptions, "light: exceptions"},
        {EventKind::kOrientationExceptions, "orientation: exceptions"},
        {EventKind::kRotationVectorExceptions, "rotation vector: exceptions"},
        {EventKind::kScreenSamples, "screen samples of the day"},
        {EventKind::kLongProximity, "long use of the proximity sensor"},
        {EventKind::kUltrasonic, "ultrasonic proximity"},
        {EventKind::kOrientationApps, "orientation: who used it"},
        {EventKind::kOrientationTotals, "orientation: totals since ever"},
        {EventKind::kChatCallLocked, "chat call: proximity locked up"},
        {EventKind::kChatCalls, "chat calls of the day"},
};

/** The keys of known payloads, where they do not speak for themselves. */
constexpr std::pair<std::string_view, std::string_view> kKeys[] = {
        {"TempInvalidRate", "failures/uses"},
        {"app_list", "apps"},
        {"count", "samples"},
        {"fastChargeTime", "fast charging"},
        {"info", "apps"},
        {"invalid", "locked up"},
        {"otherChargeTime", "other charging"},
        {"pkg", "app"},
        {"reason", "exceptions"},
        {"shockAndChargeTime", "shock and charge"},
        {"status", "counts"},
        {"time", "held"},
        {"total", "sessions"},
        {"totalTime", "in all"},
        {"ultraEnergy", "background/fluctuant energy"},
        {"ultraExpired", "code"},
        {"usbChargeTime", "USB charging"},
        {"variance", "spread of x/y/z"},
};

constexpr std::pair<Property, std::string_view> kProperties[] = {
        {Property::kOrientationDays, "orientation: days counted"},
        {Property::kOrientationFastCharging, "orientation: seconds, fast charging"},
        {Property::kOrientationOtherCharging, "orientation: seconds, other charging"},
        {Property::kOrientationShockAndCharge, "orientation: seconds, shock and charge"},
        {Property::kOrientationTotal, "orientation: seconds in all"},
        {Property::kOrientationUsbCharging, "orientation: seconds, USB charging"},
        {Property::kInvalidDevices, "ultrasonic: invalid devices"},
        {Property::kDetectCounts, "exceptions of each sensor family"},
        {Property::kScreenSamples, "screen samples"},
        {Property::kInvalidRoutes, "ultrasonic: invalid routes"},
        {Property::kReceiverClosures, "ultrasonic: receiver closures"},
        {Property::kUltrasonicEnables, "ultrasonic: enables"},
        {Property::kInvalidCalls, "ultrasonic: calls that failed"},
        {Property::kUltrasonicCalls, "ultrasonic: calls"},
        {Property::kChatCalls, "chat calls: sessions_locked up_locks_near"},
};

template <typename Name, size_t Size>
std::string_view lookUp(const std::pair<Name, std::string_view> (&table)[Size], const Name& name) {
    const auto* found = std::find_if(std::begin(table), std::end(table),
                                     [&](const auto& each) { return each.first == name; });
    return found == std::end(table) ? std::string_view() : found->second;
}

std::string_view describeKey(EventKind kind, std::string_view key) {
    if (kind == EventKind::kUnknown) return key;
    if (kind == EventKind::kOrientationTotals && key == "pkg") return "last app";
    const std::string_view meaning = lookUp(kKeys, key);
    return meaning.empty() ? key : meaning;
}

/** `text` as its kind is shown; as it is, if it is no number. */
std::string show(Kind kind, const std::string& text) {
    int64_t number = 0;
    const char* const end = text.data() + text.size();
    const bool isNumber = std::from_chars(text.data(), end, number).ptr == end && !text.empty();
    if (!isNumber || number < 0 || kind == Kind::kText || kind == Kind::kCount) return text;
    return kind == Kind::kSeconds ? base::formatDuration(std::chrono::seconds(number))
                                  : formatRate(number);
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
        const bool isThere = std::any_of(field.entries.begin(), field.entries.end(),
                                         [wanted = key](const Entry& entry) {
                                             return !day::valueOf(entry, wanted).empty();
                                         });
        if (!isThere) continue;
        keys.push_back(key);
        columns.push_back({std::string(title),
                           kind == Kind::kText ? Table::Column::kCut : Table::Column::kRight});
    }
    Table table(columns, limit);
    for (const Entry& entry : field.entries) {
        std::vector<std::string> cells;
        for (const std::string_view key : keys) {
            const std::string text(day::valueOf(entry, key));
            cells.push_back(key == "pkg" ? shortenApp(text) : show(kindOf(key), text));
        }
        table.add(cells);
    }
    return table;
}

/** What a value says that is no list. */
std::string showPlain(const Field& field) {
    const std::string_view code = field.key == "ultraExpired"
                                          ? lookUp(kUltraCodes, std::string_view(field.text))
                                          : std::string_view();
    if (!code.empty()) return field.text + ", " + std::string(code);
    if (field.key == "pkg") return safe(shortenApp(field.text));
    if (field.entries.empty()) return safe(show(kindOf(field.key), field.text));
    std::vector<std::string> texts;
    for (const auto& [key, value] : field.entries[0]) texts.push_back(key + ' ' + safe(value));
    return join(texts);
}

}  // namespace

std::string shortenApp(const std::string& app) {
    const size_t half = app.size() / 2;
    const bool isTwice = app.size() % 2 == 1 && app[half] == '/' &&
                         app.compare(0, half, app, half + 1, half) == 0;
    return isTwice ? app.substr(0, half) : app;
}

Section layOutEvent(const day::Event& event, size_t limit) {
    Section section;
    section.heading = formatTimeOfDay(event.at) + "  " + safe(event.id);
    const std::string_view meaning = describe(event.payload.kind);
    if (!meaning.empty()) section.heading.append("  ").append(meaning);
    Section::List values;
    for (const Field& field : event.payload.fields) {
        if (field.isList) {
            section.add(layOutList(field, limit), "report", "What it lists");
        } else {
            values.items.push_back(safe(describeKey(event.payload.kind, field.key)) + ": " +
                                   showPlain(field));
        }
    }
    if (!values.items.empty()) section.lists.push_back(std::move(values));
    return section;
}

std::string_view describe(EventKind kind) {
    return lookUp(kEvents, kind);
}

Table propertyTable(const std::map<std::string, std::string>& properties) {
    Table table({{"Property", Table::Column::kCut},
                 {"Value", Table::Column::kCut},
                 {"Meaning", Table::Column::kCut}},
                properties.size());
    for (const auto& [name, value] : properties) {
        table.add({name, value, std::string(lookUp(kProperties, trace::propertyOf(name)))});
    }
    return table;
}

void writeFields(const std::vector<Field>& fields, base::JsonWriter* json) {
    const auto write = [json](const Entry& entry) {
        json->beginObject();
        for (const auto& [key, value] : entry) json->member(key, value);
        json->endObject();
    };
    json->beginObject();
    for (const Field& field : fields) {
        json->key(field.key);
        if (field.isList) {
            json->beginArray();
            for (const Entry& entry : field.entries) write(entry);
            json->endArray();
        } else if (field.entries.empty()) {
            json->value(field.text);
        } else {
            write(field.entries[0]);
        }
    }
    json->endObject();
}

}  // namespace report
