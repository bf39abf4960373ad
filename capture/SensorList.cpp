#include "capture/SensorList.h"

#include <string>

#include "capture/CaptureText.h"

namespace capture {

// "0x00000001) NAME | VENDOR | ver: N | type: STRING(NUMBER) | ..."; handle 0 comes without 0x.
void SensorList::line(std::string_view text) {
    const auto type = valueOf(text, "| type: ", {" | "});
    const size_t bracket = text.find(") ");
    if (!type || bracket == std::string_view::npos) return;
    const size_t number = type->rfind('(');
    if (number == std::string_view::npos) return;
    const auto handle = parseHandle(text.substr(0, bracket));
    const auto value = parseNumber<int32_t>(type->substr(number + 1));
    if (!handle || !value) return;
    const std::string_view name = text.substr(bracket + 2);
    add({*handle, *value, std::string(trimmed(name.substr(0, name.find('|'))))});
}

void SensorList::add(const SensorList& other) {
    for (const trace::Sensor& sensor : other.mSensors) add(sensor);
}

std::optional<int32_t> SensorList::typeOf(uint32_t handle) const {
    const auto found = mTypes.find(handle);
    return found == mTypes.end() ? std::nullopt : std::optional(found->second);
}

void SensorList::add(const trace::Sensor& sensor) {
    if (mTypes.emplace(sensor.handle, sensor.type).second) mSensors.push_back(sensor);
}

}  // namespace capture
