#include "capture/dump/SensorList.h"

#include <algorithm>
#include <string>
#include <utility>

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

/** "0x00000001) NAME | VENDOR | ver: N | type: STRING(NUMBER) | ..."; handle 0 comes without 0x. */
std::optional<trace::Sensor> parseSensor(std::string_view text) {
    const auto type = valueOf(text, "| type: ", {" | "});
    const size_t bracket = text.find(") ");
    if (!type || bracket == std::string_view::npos) return std::nullopt;
    const size_t number = type->rfind('(');  // the type's own name may hold brackets, too
    if (number == std::string_view::npos) return std::nullopt;
    const auto handle = parseHandle(text.substr(0, bracket));
    const auto value = parseNumber<int32_t>(type->substr(number + 1));
    if (!handle || !value) return std::nullopt;
    const std::string_view name = text.substr(bracket + 2);
    trace::Sensor sensor;
    sensor.handle = *handle;
    sensor.type = *value;
    sensor.name = trimmed(name.substr(0, name.find('|')));
    return sensor;
}

}  // namespace

void SensorList::takeLine(std::string_view text) {
    if (auto sensor = parseSensor(text)) {
        mAwaitsMode = insert(std::move(*sensor));
    } else if (std::exchange(mAwaitsMode, false)) {
        takeMode(text, &mSensors.back());
    }
}

void SensorList::takeMissing(const SensorList& other) {
    for (const trace::Sensor& sensor : other.mSensors) insert(sensor);
}

const trace::Sensor* SensorList::find(uint32_t handle) const {
    const auto found = mPlaces.find(handle);
    return found == mPlaces.end() ? nullptr : &mSensors[found->second];
}

const trace::Sensor* SensorList::findOneShot(std::string_view name) const {
    const auto found =
            std::find_if(mSensors.begin(), mSensors.end(), [&](const trace::Sensor& sensor) {
                return sensor.mode == trace::SensorMode::kOneShot && sensor.name == name;
            });
    return found == mSensors.end() ? nullptr : &*found;
}

bool SensorList::insert(trace::Sensor sensor) {
    const bool isNew = mPlaces.emplace(sensor.handle, mSensors.size()).second;
    if (isNew) mSensors.push_back(std::move(sensor));
    return isNew;
}

void SensorList::takeMode(std::string_view text, trace::Sensor* sensor) {
    while (!text.empty()) {
        std::string_view part = takePart(&text, '|');
        if (const auto mode = trace::parseMode(part); mode != trace::SensorMode::kUnknown) {
            sensor->mode = mode;
        } else if (part == "wakeUp" || part == "non-wakeUp") {
            sensor->wakeUp = part == "wakeUp";
        } else if (takePrefix(&part, "minRate=")) {
            sensor->minRate = parseNumber<float>(part);
        } else if (takePrefix(&part, "maxRate=")) {
            sensor->maxRate = parseNumber<float>(part);
        }
    }
}

}  // namespace capture
