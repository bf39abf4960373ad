#include "capture/dump/DirectConnections.h"

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr std::string_view kOlder = ", HAL channel handle ";
constexpr std::string_view kNewer = "| HAL channel handle ";

}  // namespace

void DirectConnections::takeLine(std::string_view text, int64_t lineNumber) {
    bool isReadable = true;
    if (text.find(kNewer) != std::string_view::npos) {
        isReadable = takeNewer(text);
    } else if (takePrefix(&text, "Package ")) {
        isReadable = takeOlder(text);
    } else if (takePrefix(&text, "Activated sensor count: ")) {
        const auto count = parseNumber<int64_t>(text);
        isReadable = count && !mChannels.empty();
        if (isReadable) mChannels.back().sensors = *count;
    } else if (takePrefix(&text, "Sensor 0x")) {
        isReadable = takeSensor(text);
    }
    if (!isReadable) mUnreadable.add(text, lineNumber);
}

/** "P, HAL channel handle N, total sensor activated N" */
bool DirectConnections::takeOlder(std::string_view text) {
    const size_t end = text.rfind(kOlder);
    const std::string_view package = trimmed(text.substr(0, end));
    const auto count = parseNumber<int64_t>(valueOf(text, "total sensor activated ").value_or(""));
    if (end == std::string_view::npos || !isName(package) || !count) return false;
    trace::DirectChannel& channel = mChannels.emplace_back();
    channel.package = package;
    channel.sensors = *count;
    return true;
}

/** "P | HAL channel handle N | uid U | pid N" */
bool DirectConnections::takeNewer(std::string_view text) {
    const size_t end = text.rfind(kNewer);
    const std::string_view package = trimmed(text.substr(0, end));
    const auto uid = parseNumber<int32_t>(valueOf(text.substr(end), "| uid ").value_or(""));
    if (!isName(package) || !uid) return false;
    trace::DirectChannel& channel = mChannels.emplace_back();
    channel.package = package;
    channel.uid = uid;
    return true;
}

/** "00000001, rate 2", of a channel that is known */
bool DirectConnections::takeSensor(std::string_view text) {
    const auto rate = parseNumber<int64_t>(valueOf(text, ", rate ").value_or(""));
    if (!rate || mChannels.empty()) return false;
    mChannels.back().rates.push_back(*rate);
    return true;
}

}  // namespace capture
