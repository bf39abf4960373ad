#include "capture/dump/Connections.h"

#include <algorithm>

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr std::string_view kClient = "| WakeLockRefCount ";
constexpr std::string_view kSensor = "| status:";
constexpr std::string_view kNewerSensor = "| first flush pending:";

/** The handle is the last word; the sensor's name in front of it may hold anything. */
std::optional<uint32_t> handleBehind(std::string_view name) {
    const std::string_view word = name.substr(name.find_last_of(" \t") + 1);
    return startsWith(word, "0") ? parseHandle(word) : std::nullopt;
}

std::optional<bool> parseAccess(std::string_view rest) {
    const auto access = valueOf(rest, "| has sensor access: ", {" |"});
    if (access == "true" || access == "false") return access == "true";
    return std::nullopt;
}

}  // namespace

// A tag may hold what separates the columns, so a line is taken apart from behind.
void Connections::takeLine(std::string_view text, int64_t lineNumber) {
    const auto cutAt = [&](std::string_view mark) -> std::optional<std::string_view> {
        const size_t found = text.rfind(mark);
        if (found == std::string_view::npos) return std::nullopt;
        return trimmed(text.substr(0, found));
    };
    if (const auto tag = cutAt(kClient)) {
        ++mFound;
        mIsReadable = takeClient(*tag, text.substr(text.rfind(kClient)));
        if (!mIsReadable) mUnreadable.add(text, lineNumber);
    } else if (auto name = cutAt(kSensor); name || (name = cutAt(kNewerSensor))) {
        if (mIsReadable && !takeSensor(*name)) mUnreadable.add(text, lineNumber);
    } else if (takePrefix(&text, "Operating Mode: ") && text != "NORMAL" && !mOperatingMode) {
        mOperatingMode = text;
    }
}

bool Connections::takeClient(std::string_view tag, std::string_view rest) {
    const auto uid = parseNumber<int32_t>(valueOf(rest, "| uid ").value_or(""));
    if (!uid || !isName(tag)) return false;
    ClientConnection& connection = mConnections.emplace_back();
    connection.tag = tag;
    connection.uid = *uid;
    connection.hasAccess = parseAccess(rest);
    connection.wakeLocks = parseNumber<int64_t>(rest.substr(kClient.size()));
    return true;
}

bool Connections::takeSensor(std::string_view nameAndHandle) {
    const auto handle = handleBehind(nameAndHandle);
    if (!handle) return false;
    auto& handles = mConnections.back().handles;
    if (std::find(handles.begin(), handles.end(), *handle) == handles.end()) {
        handles.push_back(*handle);
    }
    return true;
}

std::optional<int64_t> parseCount(std::string_view heading, std::string_view words) {
    const std::string_view number = takeWord(&heading);
    return areDigits(number) && heading == words ? parseNumber<int64_t>(number) : std::nullopt;
}

}  // namespace capture
