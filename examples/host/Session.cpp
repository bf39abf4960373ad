#include "examples/host/Session.h"

#include <algorithm>
#include <cstdio>
#include <iterator>
#include <sstream>
#include <thread>
#include <tuple>
#include <type_traits>

#include <cutils/properties.h>

#include "core/Log.h"
#include "examples/host/SensorService.h"
#include "platform/Display.h"
#include "platform/PropertyService.h"
#include "rgb/LightSensorState.h"
#include "rgb/RgbShotManager.h"

namespace host {

using android::RgbShotManager;

namespace {

template <typename Value>
bool read(std::istream& words, Value* value) {
    return static_cast<bool>(words >> *value);
}

/** All that is left of the line. */
template <typename Value>
bool read(std::istream& words, std::vector<Value>* values) {
    for (Value value; words >> value;) values->push_back(value);
    return words.eof();
}

bool isHour(int hour) {
    return hour >= 0 && hour < 24;
}

}  // namespace

const Session::Command Session::kCommands[] = {
        {"boot", "", call<&SensorService::bootCompleted>},
        {"down", "", call<&SensorService::goDown>},
        {"charge", "STATE", call<&SensorService::charge>},
        {"days", "COUNT", call<&SensorService::countDays>},
        {"display", "STATE", call<&SensorService::display>},
        {"notify", "NUMBER...", call<&SensorService::notify>},
        {"broken", "TYPE", call<&SensorService::dataFlowBroke>},
        {"ultra", "CODE PKG PHONESTATE", call<&SensorService::ultraActs>},
        {"transition", "STATUS", call<&SensorService::changeTransition>},
        {"settle", "", call<&SensorService::settle>},
        {"enable", "PKG OPPKG TYPE RATE", call<&Session::enable>},
        {"disable", "PKG OPPKG TYPE", call<&Session::disable>},
        {"disconnect", "PKG OPPKG", call<&Session::disconnect>},
        {"event", "TYPE NUMBER...", call<&Session::event>},
        {"change", "touch|lux|color|user|mode|eye|policy", call<&Session::change>},
        {"set", "VARIABLE VALUE", call<&Session::set>},
        {"hours", "FIRST LAST", call<&Session::hours>},
        {"sleep", "MS", call<&Session::sleep>},
        {"show", "RED GREEN BLUE", call<&Session::show>},
        {"setprop", "NAME VALUE", call<&Session::setProperty>},
        {"getprop", "NAME", call<&Session::printProperty>},
        {"stop", "", call<&Session::stop>},
};

Session::Session(SensorService* service, std::chrono::milliseconds hour)
      : mService(service),
        mHour(hour) {}

std::optional<std::string> Session::run(const std::string& line) {
    std::istringstream words(line);
    std::string name;
    if (!(words >> name) || name[0] == '#') return std::nullopt;
    const auto* const command =
            std::find_if(std::begin(kCommands), std::end(kCommands),
                         [&](const Command& each) { return each.name == name; });
    if (command == std::end(kCommands)) return "unknown command: " + name;
    return command->run(this, *command, words);
}

template <auto operation>
Session::Error Session::call(Session* session, const Command& command, std::istream& words) {
    return session->call(operation, command, words);
}

template <typename Class, typename Result, typename... Arguments>
Session::Error Session::call(Result (Class::*operation)(Arguments...), const Command& command,
                             std::istream& words) {
    std::tuple<std::decay_t<Arguments>...> arguments;
    const auto readAll = [&](auto&... each) { return (read(words, &each) && ...); };
    if (!std::apply(readAll, arguments) || !(words >> std::ws).eof()) {
        return std::string("usage: ") + command.name + ' ' + command.arguments;
    }
    const auto invoke = [&](auto&... each) {
        if constexpr (std::is_same_v<Class, SensorService>) {
            return (mService->*operation)(each...);
        } else {
            return (this->*operation)(each...);
        }
    };
    if constexpr (std::is_void_v<Result>) {
        std::apply(invoke, arguments);
        return std::nullopt;
    } else {
        return std::apply(invoke, arguments);
    }
}

void Session::enable(const std::string& pkg, const std::string& opPkg, int type, long long rate) {
    auto& connection = mConnections[{pkg, opPkg}];
    if (connection == nullptr) connection = std::make_unique<Connection>(pkg, opPkg);
    connection->enable(type, rate);
}

Session::Error Session::disable(const std::string& pkg, const std::string& opPkg, int type) {
    const auto it = mConnections.find({pkg, opPkg});
    if (it == mConnections.end()) return "has no connection: " + pkg + ' ' + opPkg;
    it->second->disable(type);
    return std::nullopt;
}

Session::Error Session::disconnect(const std::string& pkg, const std::string& opPkg) {
    if (mConnections.erase({pkg, opPkg}) > 0) return std::nullopt;
    return "has no connection: " + pkg + ' ' + opPkg;
}

Session::Error Session::event(int type, const std::vector<float>& data) {
    sensors_event_t event{};
    if (data.size() > std::size(event.data)) return "an event has at most 16 numbers";
    event.version = sizeof(event);
    event.type = type;
    std::copy(data.begin(), data.end(), event.data);
    mService->post(event);
    return std::nullopt;
}

Session::Error Session::change(const std::string& what) {
    static constexpr std::pair<const char*, void (RgbShotManager::*)()> kChanges[] = {
            {"touch", &RgbShotManager::onTouchChange}, {"lux", &RgbShotManager::luxChange},
            {"color", &RgbShotManager::colorChange},   {"user", &RgbShotManager::onUserPresent},
            {"mode", &RgbShotManager::autoModeChange}, {"eye", &RgbShotManager::eyeChange},
            {"policy", &RgbShotManager::policyChange},
    };
    for (const auto& [name, trigger] : kChanges) {
        if (name != what) continue;
        mService->happened(trigger);
        return std::nullopt;
    }
    return "unknown change: " + what;
}

Session::Error Session::set(const std::string& name, int value) {
#define CALL(Class, operation, parameters)
#define VARIABLE(variable)                                     \
    if (name == #variable) {                                   \
        ::variable = static_cast<decltype(::variable)>(value); \
        return std::nullopt;                                   \
    }
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
    return "unknown variable: " + name;
}

Session::Error Session::hours(int first, int last) {
    if (!isHour(first) || !isHour(last)) return "an hour is 0 to 23";
    for (int hour = first;; hour = (hour + 1) % 24) {
        mService->passHour(hour, mHour);
        if (hour == last) return std::nullopt;
    }
}

Session::Error Session::show(int red, int green, int blue) {
    for (const int value : {red, green, blue}) {
        if (value < 0 || value > 255) return "a colour is three numbers from 0 to 255";
    }
    platform::DisplayChange change;
    change.color = {static_cast<uint8_t>(red), static_cast<uint8_t>(green),
                    static_cast<uint8_t>(blue)};
    platform::changeDisplay(change);
    return std::nullopt;
}

Session::Error Session::setProperty(const std::string& name, const std::string& value) {
    Error error = platform::refuseProperty(name, value);
    if (!error) platform::setDeviceProperty(name, value);
    return error;
}

void Session::printProperty(const std::string& name) {
    char value[PROPERTY_VALUE_MAX];
    property_get(name.c_str(), value, "");
    std::printf("%s: %s\n", name.c_str(), value);
}

void Session::sleep(int milliseconds) {
    std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
}

}  // namespace host
