#include "trace/Note.h"

#include <array>
#include <cstddef>
#include <limits>
#include <type_traits>
#include <utility>

#include <simdjson.h>

#include "base/Json.h"

namespace trace {

using simdjson::dom::element;

namespace {

constexpr std::array<std::string_view, 5> kModes{"", "continuous", "on-change", "one-shot",
                                                 "special-trigger"};
constexpr std::array<std::string_view, 5> kBounds{"stamp", "capturedAt", "header", "registration",
                                                  "event"};
constexpr std::array<std::string_view, 2> kHows{"fired", "unseen"};

// What each record of a note holds, for the writer and the reader below.

/** `T` as `Fields` visits it: the writer takes it const. */
template <typename Fields, typename T>
using As = typename Fields::template As<T>;

template <typename Fields>
void visit(Fields& fields, As<Fields, Interval>& interval) {
    fields("from", interval.from);
    fields("to", interval.to);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, Sensor>& sensor) {
    fields("handle", sensor.handle);
    fields("name", sensor.name);
    fields("type", sensor.type);
    fields("mode", sensor.mode, kModes);
    fields("wakeUp", sensor.wakeUp);
    fields("minRate", sensor.minRate);
    fields("maxRate", sensor.maxRate);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, CaptureNote>& capture) {
    fields("files", capture.files);
    fields("taken", capture.taken);
    fields("midnight", capture.midnight);
    fields("registrations", capture.registrations);
    fields("from", capture.from);
    fields("to", capture.to);
    fields("knownTo", capture.knownTo);
    fields("bound", capture.bound, kBounds);
    fields("warnings", capture.warnings);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, KnownStates>& known) {
    fields("display", known.display);
    fields("charge", known.charge);
    fields("camera", known.camera);
    fields("call", known.call);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, UidPackages>& packages) {
    fields("uid", packages.uid);
    fields("names", packages.names);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, Client>& client) {
    fields("pkg", client.pkg);
    fields("uid", client.uid);
    fields("handle", client.handle);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, RegistrationNote>& registration) {
    fields("handle", registration.handle);
    fields("uid", registration.uid);
    fields("batchUs", registration.batchUs);
    fields("before", registration.before, false);
    fields("rateKnown", registration.rateKnown, true);
    fields("level", registration.level);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, EndNote>& end) {
    visit(fields, end.client);
    fields("how", end.how, kHows);
    fields("at", end.at);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, Connection>& connection) {
    visit(fields, connection.client);
    fields("count", connection.count);
    fields("hasAccess", connection.hasAccess);
    fields("wakeLocks", connection.wakeLocks);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, DirectChannel>& channel) {
    fields("package", channel.package);
    fields("uid", channel.uid);
    fields("sensors", channel.sensors);
    fields("rates", channel.rates);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, RefusedNote>& refused) {
    visit(fields, refused.client);
    fields("count", refused.count);
    fields("result", refused.result);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, ChargeRow>& row) {
    fields("uid", row.uid);
    fields("handle", row.handle);
    fields("ms", row.ms);
    fields("count", row.count);
    fields("backgroundMs", row.background);
    fields("shared", row.shared);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, SinceCharge>& charge) {
    fields("onBatteryMs", charge.onBatteryMs);
    fields("startMs", charge.startMs);
    fields("rows", charge.rows);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, TakenNote>& taken) {
    fields("connections", taken.connections);
    fields("direct", taken.direct);
    fields("operatingMode", taken.operatingMode);
    fields("refused", taken.refused);
    fields("sinceCharge", taken.sinceCharge);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, LostNote>& lost) {
    fields("from", lost.from);
    fields("to", lost.to);
    fields("why", lost.why);
}

template <typename Fields>
void visit(Fields& fields, As<Fields, HangNote>& hang) {
    fields("from", hang.from);
}

/** The registration's members stand in the note itself: they tell of the line. */
template <typename Fields>
void visit(Fields& fields, As<Fields, Note>& note) {
    fields("capture", note.capture);
    fields("sensors", note.sensors);
    fields("packages", note.packages);
    fields("known", note.known);
    fields("gaps", note.gaps);
    fields("end", note.end);
    fields("taken", note.taken);
    fields("lost", note.lost);
    fields("hang", note.hang);
}

/** Writes members; those without a value are left out. */
class Writer {
public:
    template <typename T>
    using As = const T;

    explicit Writer(base::JsonWriter* json) : mJson(*json) {}

    template <typename T>
    void operator()(std::string_view key, const T& value) {
        mJson.key(key);
        write(value);
    }

    template <typename T>
    void operator()(std::string_view key, const std::optional<T>& value) {
        if (!value) return;
        mJson.key(key);
        write(*value);  // an empty list, too: it is known to be empty
    }

    template <typename T>
    void operator()(std::string_view key, const std::vector<T>& list) {
        if (list.empty()) return;
        mJson.key(key);
        write(list);
    }

    void operator()(std::string_view key, bool value, bool usual) {
        if (value != usual) mJson.member(key, value);
    }

    template <typename Enum, size_t Size>
    void operator()(std::string_view key, const Enum& value,
                    const std::array<std::string_view, Size>& words) {
        const std::string_view word = words[static_cast<size_t>(value)];
        if (!word.empty()) mJson.member(key, word);
    }

private:
    template <typename T>
    void write(const T& value) {
        if constexpr (std::is_arithmetic_v<T> || std::is_same_v<T, std::string>) {
            mJson.value(value);
        } else {
            mJson.beginObject();
            visit(*this, value);
            mJson.endObject();
        }
    }

    template <typename T>
    void write(const std::vector<T>& list) {
        mJson.beginArray();
        for (const T& item : list) write(item);
        mJson.endArray();
    }

    base::JsonWriter& mJson;
};

/** Reads members of an object; those that are missing or of another form stay as they are. */
class Reader {
public:
    template <typename T>
    using As = T;

    explicit Reader(element object) : mObject(object) {}

    bool has(std::string_view key) const { return !mObject.at_key(key).error(); }

    template <typename T>
    void operator()(std::string_view key, T& value) {
        element json;
        if (mObject.at_key(key).get(json) == simdjson::SUCCESS) read(json, value);
    }

    void operator()(std::string_view key, bool& value, bool) { (*this)(key, value); }

    template <typename Enum, size_t Size>
    void operator()(std::string_view key, Enum& value,
                    const std::array<std::string_view, Size>& words) {
        std::string word;
        (*this)(key, word);
        for (size_t i = 0; i < Size; ++i) {
            if (!word.empty() && words[i] == word) value = static_cast<Enum>(i);
        }
    }

private:
    template <typename T>
    static bool read(element json, T& value) {
        if constexpr (std::is_same_v<T, bool>) {
            return json.get(value) == simdjson::SUCCESS;
        } else if constexpr (std::is_same_v<T, float>) {
            double number = 0;
            if (json.get(number) != simdjson::SUCCESS) return false;
            value = static_cast<float>(number);
            return true;
        } else if constexpr (std::is_integral_v<T>) {
            int64_t number = 0;
            if (json.get(number) != simdjson::SUCCESS || number < std::numeric_limits<T>::min() ||
                (sizeof(T) < sizeof(number) && number > int64_t{std::numeric_limits<T>::max()})) {
                return false;
            }
            value = static_cast<T>(number);
            return true;
        } else if constexpr (std::is_same_v<T, std::string>) {
            std::string_view text;
            if (json.get(text) != simdjson::SUCCESS) return false;
            value = text;
            return true;
        } else {
            if (!json.is_object()) return false;
            Reader members(json);
            visit(members, value);
            return true;
        }
    }

    template <typename T>
    static bool read(element json, std::optional<T>& value) {
        T inner{};
        if (!read(json, inner)) return false;
        value = std::move(inner);
        return true;
    }

    template <typename T>
    static bool read(element json, std::vector<T>& list) {
        simdjson::dom::array items;
        if (json.get(items) != simdjson::SUCCESS) return false;
        for (const element item : items) {
            T value{};
            if (read(item, value)) list.push_back(std::move(value));
        }
        return true;
    }

    const element mObject;
};

}  // namespace

std::string_view nameOf(SensorMode mode) {
    return kModes[static_cast<size_t>(mode)];
}

SensorMode parseMode(std::string_view word) {
    for (size_t i = 1; i < kModes.size(); ++i) {
        if (kModes[i] == word) return static_cast<SensorMode>(i);
    }
    return SensorMode::kUnknown;
}

void writeNote(const Note& note, base::JsonWriter* json) {
    Writer writer(json);
    json->beginObject();
    visit(writer, note);
    if (note.registration) visit(writer, *note.registration);
    json->endObject();
}

std::string toJson(const Note& note) {
    std::string text;
    base::JsonWriter json(&text);
    writeNote(note, &json);
    return text;
}

Note parseNote(std::string_view json) {
    Note note;
    thread_local simdjson::dom::parser parser;  // keeps its memory
    element document;
    if (parser.parse(json.data(), json.size()).get(document) != simdjson::SUCCESS) return note;
    Reader reader(document);
    if (!document.is_object()) return note;
    visit(reader, note);
    if (reader.has("handle")) visit(reader, note.registration.emplace());
    return note;
}

}  // namespace trace
