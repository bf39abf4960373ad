#include "record/Screen.h"

#include <algorithm>
#include <cstdint>

#include "base/Json.h"

namespace record {

namespace {

template <size_t Size>
void writeList(base::JsonWriter* json, const char* key, const std::array<int, Size>& values) {
    json->key(key).beginArray();
    for (const int value : values) json->value(value);
    json->endArray();
}

/**
 * The colour of the display by which `rect` has the average `value`, where its pixels left of and
 * above the display read as 0.
 */
int colorFor(int value, const int* rect) {
    const auto whole = [&](int from, int to) { return int64_t{rect[to]} - rect[from]; };
    const auto shown = [&](int from, int to) {
        return int64_t{rect[to]} - std::max(rect[from], 0);
    };
    const int64_t area = whole(0, 2) * whole(1, 3);
    const int64_t lit = std::max<int64_t>(shown(0, 2), 0) * std::max<int64_t>(shown(1, 3), 0);
    if (area <= 0 || lit <= 0) return std::clamp(value, 0, 255);
    return static_cast<int>(std::clamp<int64_t>((value * area + lit - 1) / lit, 0, 255));
}

}  // namespace

std::string Screen::take(const int* rgb, const int* rect) {
    std::string changes;
    base::JsonWriter json(&changes);
    if (rgb != nullptr) {
        const Size old = mSize.value_or(Size{1080, 2400});
        const Size size{std::max(old[0], rect[2]), std::max(old[1], rect[3])};
        const Color color{colorFor(rgb[0], rect), colorFor(rgb[1], rect), colorFor(rgb[2], rect)};
        if (mSize != size) writeList(&json, "size", size);
        if (mColor != color) writeList(&json, "color", color);
        mSize = size;
        mColor = color;
    }
    const bool fails = rgb == nullptr;
    if (mFails != fails) json.key("fault").raw(fails ? R"("capture")" : "null");
    mFails = fails;
    std::string body;
    if (!changes.empty())
        base::JsonWriter(&body).key("display").beginObject().raw(changes).endObject();
    return body;
}

}  // namespace record
