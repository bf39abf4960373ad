#include "trace/DisplayLine.h"

#include <array>
#include <cstdint>
#include <filesystem>
#include <limits>
#include <string_view>
#include <utility>

#include "base/Json.h"

namespace trace {

using simdjson::dom::element;
using simdjson::dom::object;

namespace {

template <size_t Size>
Error checkRange(const std::array<int32_t, Size>& values, int32_t min, int32_t max) {
    for (const int32_t value : values) {
        if (value < min || value > max) {
            return "must lie from " + std::to_string(min) + " to " + std::to_string(max);
        }
    }
    return {};
}

Error readSize(element json, platform::DisplaySize* size) {
    std::array<int32_t, 2> sides{};
    if (Error error = read(json, &sides)) return error;
    *size = {static_cast<uint32_t>(sides[0]), static_cast<uint32_t>(sides[1])};
    return checkRange(sides, 1, std::numeric_limits<int32_t>::max());
}

Error readColor(element json, platform::Color* color) {
    std::array<int32_t, 3> rgb{};
    if (Error error = read(json, &rgb)) return error;
    *color = {static_cast<uint8_t>(rgb[0]), static_cast<uint8_t>(rgb[1]),
              static_cast<uint8_t>(rgb[2])};
    return checkRange(rgb, 0, 255);
}

Error readRowPadding(element json, uint32_t* pixels) {
    std::array<int32_t, 1> value{};
    if (Error error = read(json, value.data())) return error;
    *pixels = static_cast<uint32_t>(value[0]);
    return checkRange(value, 0, platform::Picture::kMaxSide);
}

Error readPicture(element json, const std::string& trace, platform::Picture* picture) {
    std::string path;
    if (Error error = read(json, &path)) return error;
    // An absolute path stands for itself; standard input, "-", is beside the current directory.
    const auto file = std::filesystem::path(trace).parent_path() / path;
    if (Error error = platform::readPng(file, picture)) return base::quote(path) + ": " + *error;
    return {};
}

Error readFault(element json, platform::DisplayFault* fault) {
    constexpr std::pair<std::string_view, platform::DisplayFault> kFaults[] = {
            {"token", platform::DisplayFault::kToken},
            {"capture", platform::DisplayFault::kCapture},
            {"results", platform::DisplayFault::kResults},
            {"lock", platform::DisplayFault::kLock},
            {"listener", platform::DisplayFault::kListener},
            {"twice", platform::DisplayFault::kTwice},
            {"noDisplay", platform::DisplayFault::kNoDisplay},
            {"fence", platform::DisplayFault::kFence},
    };
    *fault = platform::DisplayFault::kNone;
    if (json.is_null()) return {};
    std::string_view name;
    if (json.get(name) == simdjson::SUCCESS) {
        for (const auto& [known, value] : kFaults) {
            if (name == known) *fault = value;
        }
    }
    if (*fault != platform::DisplayFault::kNone) return {};
    return R"(must be "token", "capture", "results", "lock", "listener", "twice", "noDisplay", )"
           R"("fence" or null)";
}

}  // namespace

Error readDisplay(element json, const std::string& trace, platform::DisplayChange* change) {
    *change = {};
    object values;
    if (json.get(values) != simdjson::SUCCESS) return R"("display" must be an object)";
    if (Error error = checkKeys(values)) return error;
    for (const auto [key, value] : values) {
        Error error;
        if (key == "size") {
            error = readSize(value, &change->size.emplace());
        } else if (key == "color") {
            error = readColor(value, &change->color.emplace());
        } else if (key == "png") {
            error = readPicture(value, trace, &change->picture.emplace());
        } else if (key == "rowPadding") {
            error = readRowPadding(value, &change->rowPadding.emplace());
        } else if (key == "fault") {
            error = readFault(value, &change->fault.emplace());
        } else {
            return "unknown key " + base::quote(key);
        }
        if (error) return base::quote(key) + ' ' + *error;
    }
    if (change->picture && (change->size || change->color)) {
        return R"("png" together with "size" or "color")";
    }
    return {};
}

}  // namespace trace
