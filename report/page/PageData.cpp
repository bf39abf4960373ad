#include "report/page/PageData.h"

#include <cstdio>

#include "base/Json.h"
#include "report/page/DayPicture.h"

namespace report::page {

namespace {

using base::JsonWriter;
using base::Ms;

/** Begins an array with the bounds of a span. */
JsonWriter& beginSpan(const Span& span, JsonWriter* json) {
    return json->beginArray().value(Ms{span.from}).value(Ms{span.to});
}

void writeSpans(std::string_view key, const std::vector<Span>& spans, JsonWriter* json) {
    json->key(key).beginArray();
    for (const Span& span : spans) beginSpan(span, json).endArray();
    json->endArray();
}

void writeUse(const Use& use, JsonWriter* json) {
    beginSpan(use.span, json).value(styleOf(use)).value(use.facts);
    char rate[32] = "null";
    if (use.rate) std::snprintf(rate, sizeof(rate), "%.17g", *use.rate);
    json->raw(rate).beginArray();
    for (const int64_t at : use.enables) json->value(Ms{at});
    json->endArray().endArray();
}

void writeDay(const Day& day, JsonWriter* json) {
    json->beginObject().key("bands").beginArray();
    for (const BandLane& lane : bandsOf(day)) {
        json->beginArray().value(lane.name).beginArray();
        for (const Slice& slice : lane.slices) {
            beginSpan(slice.span, json).value(slice.style).value(slice.facts).endArray();
        }
        json->endArray().endArray();
    }
    json->endArray().key("uses").beginArray();
    for (const Lane& lane : day.lanes) {
        json->beginArray();
        for (const Use& use : lane.uses) writeUse(use, json);
        json->endArray();
    }
    json->endArray();
    writeSpans("on", day.display.on, json);
    writeSpans("unknown", day.display.unknown, json);
    writeSpans("unseen", day.unseen, json);
    json->key("lines").beginArray();
    for (const Mark& mark : day.marks) {
        json->beginArray().value(Ms{mark.at}).value(lineStyleOf(mark)).endArray();
    }
    json->endArray().endObject();
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
    beginSpan(hours, &json.beginObject().key("hours")).endArray().key("days").beginArray();
    for (const Day& day : input.days) writeDay(day, &json);
    json.endArray().endObject();
    return inScript(text);
}

}  // namespace report::page
