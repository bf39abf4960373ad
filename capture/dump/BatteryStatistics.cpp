#include "capture/dump/BatteryStatistics.h"

#include <algorithm>
#include <optional>

#include "capture/text/CaptureText.h"

namespace capture {

namespace {

constexpr size_t kMostNumbers = 6;  // of those that a line may begin with, as many as are used

/** Takes the numbers between commas that stand first off `fields`. */
std::vector<int64_t> takeNumbers(std::string_view* fields) {
    std::vector<int64_t> numbers;
    while (!fields->empty() && numbers.size() < kMostNumbers) {
        const auto number = parseNumber<int64_t>(fields->substr(0, fields->find(',')));
        if (!number) break;
        numbers.push_back(*number);
        takePart(fields, ',');
    }
    return numbers;
}

}  // namespace

// "9,UID,KIND,TAG,FIELDS": the kind is "i" for what is so, "l" for what was since the last charge.
void BatteryStatistics::takeLine(std::string_view text, int64_t lineNumber) {
    std::string_view fields = text;
    if (!parseNumber<int32_t>(takePart(&fields, ','))) return;
    const auto uid = parseNumber<int32_t>(takePart(&fields, ','));
    const std::string_view kind = takePart(&fields, ',');
    const std::string_view tag = takePart(&fields, ',');
    bool isReadable = true;
    if (kind == "i" && tag == "vers") {
        mBuild = fields;
    } else if (kind == "i" && tag == "uid") {
        isReadable = takePackage(fields);
    } else if (kind == "l" && tag == "bt") {
        isReadable = takeBattery(fields);
    } else if (kind == "l" && tag == "sr") {
        isReadable = uid && takeSensor(*uid, fields);
    } else {
        return;
    }
    mHasLines = true;
    if (!isReadable) mUnreadable.add(text, lineNumber);
}

bool BatteryStatistics::takePackage(std::string_view fields) {
    const auto uid = parseNumber<int32_t>(takePart(&fields, ','));
    if (!uid || !isName(fields)) return false;
    auto& names = mPackages[*uid];
    if (std::find(names.begin(), names.end(), fields) == names.end()) names.emplace_back(fields);
    return true;
}

bool BatteryStatistics::takeBattery(std::string_view fields) {
    const std::vector<int64_t> numbers = takeNumbers(&fields);
    if (numbers.size() < 2) return false;
    mSinceCharge.onBatteryMs = numbers[1];
    if (numbers.size() > 5) mSinceCharge.startMs = numbers[5];
    return true;
}

/** "HANDLE,TIME,COUNT[,BACKGROUND COUNT,ACTUAL,BACKGROUND TIME]" */
bool BatteryStatistics::takeSensor(int32_t uid, std::string_view fields) {
    const auto handle = parseNumber<int32_t>(fields.substr(0, fields.find(',')));
    const std::vector<int64_t> numbers = takeNumbers(&fields);
    // What is between the two forms is cut, and its last number is not what it was.
    const bool isShort = numbers.size() == 3 && fields.empty();
    if (!handle || (!isShort && numbers.size() != kMostNumbers)) return false;
    trace::ChargeRow row;
    row.uid = uid;
    row.handle = *handle;
    row.shared = isShort;
    row.ms = row.shared ? numbers[1] : numbers[4];
    row.count = numbers[2];
    if (!isShort) row.background = numbers[5];
    mSinceCharge.rows.push_back(row);
    return true;
}

}  // namespace capture
