#include "report/page/PageData.h"

#include <cstdio>

#include "base/Json.h"
#include "report/page/DayPicture.h"

namespace report::page {

namespace {

using base::JsonWriter;
using base::Ms;

void writeSpans(std::string_view key, const std::vector<Span>& spans, JsonWriter* json) {
    json->key(key).beginArray();
    for (const auto& [from, to] : spans) {
        json->beginArray().value(Ms{from}).value(Ms{to}).endArray();
    }
    json->endArray();
}

void writeUse(const Use& use, JsonWriter* json) {
    json->beginArray().value(Ms{use.span.from}).value(Ms{use.span.to}).value(styleOf(use));
    json->value(use.facts);
    if (use.rate) {
        char text[32];
        std::snprintf(text, sizeof(text), "%.17g", *use.rate);
        json->raw(text);
    } else {
        json->raw("null");
    }
    json->beginArray();
    for (const int64_t at : use.enables) json->value(Ms{at});
    json->endArray().endArray();
}

void writeLines(const Day& day, JsonWriter* json) {
    json->key("lines").beginArray();
    const auto write = [json](int64_t at, const char* style) {
        json->beginArray().value(Ms{at}).value(std::string_view(style)).endArray();
    };
    for (const Mark& mark : day.reports) write(mark.at, "report");
    for (const Mark& mark : day.ahead) write(mark.at, "report");
    if (day.taken) write(day.taken->at, "taken");
    json->endArray();
}

void writeBands(const Day& day, JsonWriter* json) {
    json->key("bands").beginArray();
    for (const BandLane& lane : bandsOf(day)) {
        json->beginArray().value(lane.name).beginArray();
        for (const auto& [span, style, facts] : lane.parts) {
            json->beginArray().value(Ms{span.from}).value(Ms{span.to}).value(style);
            json->value(facts).endArray();
        }
        json->endArray().endArray();
    }
    json->endArray();
}

void writeDay(const Day& day, JsonWriter* json) {
    json->beginObject();
    writeBands(day, json);
    json->key("uses").beginArray();
    for (const Lane& lane : day.lanes) {
        json->beginArray();
        for (const Use& use : lane.uses) writeUse(use, json);
        json->endArray();
    }
    json->endArray();
    writeSpans("on", day.display.on, json);
    writeSpans("unknown", day.display.unknown, json);
    writeSpans("unseen", day.unseen, json);
    writeLines(day, json);
    json->endObject();
}

/** `json`, in which "<" stands in texts only: nothing of it can end the script element. */
std::string inScript(const std::string& json) {
    std::string safe;
    for (const char c : json) {
        if (c == '<') {
            safe += "\\u003c";
        } else {
            safe += c;
        }
    }
    return safe;
}

}  // namespace

std::string toJson(const Input& input) {
    std::string text;
    JsonWriter json(&text);
    const Span hours = hoursOf(input.days);
    json.beginObject().key("hours").beginArray();
    json.value(Ms{hours.from}).value(Ms{hours.to}).endArray().key("days").beginArray();
    for (const Day& day : input.days) writeDay(day, &json);
    json.endArray().endObject();
    return inScript(text);
}

}  // namespace report::page
