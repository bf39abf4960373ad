#include "record/Arguments.h"

#include <iterator>
#include <string_view>

#include "record/JsonText.h"
#include "record/Recorder.h"

namespace record {

namespace {

template <typename Values, typename Append>
void appendList(std::string* out, const Values* values, size_t count, Append append) {
    *out += '[';
    for (size_t i = 0; i < count; ++i) {
        if (i > 0) *out += ", ";
        append(out, values[i]);
    }
    *out += ']';
}

}  // namespace

void appendArgument(std::string* out, bool value) {
    *out += value ? "true" : "false";
}

void appendArgument(std::string* out, int value) {
    appendInteger(out, value);
}

void appendArgument(std::string* out, long long value) {
    appendInteger(out, value);
}

void appendArgument(std::string* out, const std::string& name) {
    const std::string_view text = std::string_view(name).substr(0, name.find('\0'));
    Recorder* const recorder = Recorder::get();
    Names* const names = recorder != nullptr ? recorder->names() : nullptr;
    if (names != nullptr) {
        appendText(out, names->replace(std::string(text)));
    } else {
        appendText(out, text);
    }
}

void appendArgument(std::string* out, const android::String8& name) {
    appendArgument(out, std::string(name.string()));
}

void appendArgument(std::string* out, const android::Vector<int>& list) {
    appendList(out, list.array(), list.size(), appendInteger);
}

void appendArgument(std::string* out, const int* rect) {
    appendList(out, rect, 4, appendInteger);
}

void appendArgument(std::string* out, const sensors_event_t& event) {
    size_t count = std::size(event.data);
    while (count > 0 && event.data[count - 1] == 0) --count;
    *out += R"({"type": )";
    appendInteger(out, event.type);
    *out += R"(, "data": )";
    appendList(out, event.data, count, appendFloat);
    *out += '}';
}

void appendArgument(std::string* out, const android::UltraExceptionInfo& info) {
    *out += R"({"packageName": )";
    appendArgument(out, info.packageName);
    *out += R"(, "phoneState": )";
    appendInteger(out, info.phoneState);
    *out += '}';
}

}  // namespace record
