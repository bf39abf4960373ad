#include "record/CallText.h"

#include <iterator>
#include <string_view>

#include "record/Recorder.h"

namespace record {

namespace {

template <typename Value>
void writeList(base::JsonWriter* json, const Value* values, size_t count) {
    json->beginArray();
    for (size_t i = 0; i < count; ++i) json->value(values[i]);
    json->endArray();
}

void writeName(base::JsonWriter* json, std::string_view name) {
    Recorder* const recorder = Recorder::get();
    Pseudonyms* const pseudonyms = recorder != nullptr ? recorder->pseudonyms() : nullptr;
    if (pseudonyms != nullptr) {
        json->value(pseudonyms->of(name));
    } else {
        json->value(name.substr(0, name.find('\0')));
    }
}

}  // namespace

void writeArgument(base::JsonWriter* json, bool value) {
    json->value(value);
}

void writeArgument(base::JsonWriter* json, int value) {
    json->value(value);
}

void writeArgument(base::JsonWriter* json, long long value) {
    json->value(value);
}

void writeArgument(base::JsonWriter* json, const std::string& name) {
    writeName(json, name);
}

void writeArgument(base::JsonWriter* json, const android::String8& name) {
    writeName(json, name.c_str());
}

void writeArgument(base::JsonWriter* json, const android::Vector<int>& list) {
    writeList(json, list.array(), list.size());
}

void writeArgument(base::JsonWriter* json, const int* rect) {
    writeList(json, rect, 4);
}

void writeArgument(base::JsonWriter* json, const sensors_event_t& event) {
    size_t count = std::size(event.data);
    while (count > 0 && event.data[count - 1] == 0) --count;
    json->beginObject().member("type", event.type).key("data");
    writeList(json, event.data, count);
    json->endObject();
}

void writeArgument(base::JsonWriter* json, const android::UltraExceptionInfo& info) {
    json->beginObject().key("packageName");
    writeArgument(json, info.packageName);
    json->member("phoneState", info.phoneState).endObject();
}

}  // namespace record
