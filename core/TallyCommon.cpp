#include "core/TallyCommon.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <utility>

#include <cutils/properties.h>
#include <unistd.h>

#include "core/Log.h"
#include "core/ParseInt32.h"

/** Of the device's telemetry library: three NUL-terminated texts. */
extern "C" void track_event(const char* moduleId, const char* eventId, const char* payload);

namespace android {

namespace {

constexpr char kModuleId[] = "N273";
constexpr useconds_t kBootPollUs = 200'000;

}  // namespace

Mutex TallyCommon::sLock;
TallyCommon* TallyCommon::mTallyCommon = nullptr;

TallyCommon* TallyCommon::getInstance() {
    Mutex::Autolock lock(sLock);
    if (mTallyCommon == nullptr) mTallyCommon = new TallyCommon;
    return mTallyCommon;
}

TallyCommon::TallyCommon() : mModuleId(kModuleId), mBootFinished(false) {}

void TallyCommon::trackEvent(std::string eventId, std::map<std::string, std::string> params) {
    setTally({std::move(eventId), convertMapToTally(std::move(params))});
}

void TallyCommon::setTally(DataWrapper data) {
    // [sic] The line has an error's level, although nothing is wrong.
    if (mLogSwitch != 0) SENSOR_PRIV_LOGE("SDC Event = %s", data.eventId.c_str());
    track_event(mModuleId.c_str(), data.eventId.c_str(), data.payload.c_str());
}

std::string TallyCommon::convertMapToTally(std::map<std::string, std::string> params) {
    std::string result;
    for (const auto& [key, value] : params) {
        result.append(key).append(":").append(value).append("&");
    }
    if (!result.empty()) result.pop_back();
    return result;
}

std::string TallyCommon::intToStr(int value) {
    char text[20] = {};
    std::snprintf(text, sizeof(text), "%d", value);
    return text;
}

std::string TallyCommon::longToStr(long value) {
    char text[30] = {};
    std::snprintf(text, sizeof(text), "%ld", value);
    return text;
}

void TallyCommon::splitStr(const std::string& text, const std::string& delimiter,
                           std::vector<std::string>& out) {
    std::vector<std::string> pieces;  // `text` and `delimiter` may lie in `out`
    size_t begin = 0;
    // [sic] The first cut looks for any character of the delimiter, the others look for all of it.
    // A delimiter of one character makes no difference.
    size_t end = delimiter.empty() ? std::string::npos : text.find_first_of(delimiter);
    while (end != std::string::npos) {
        pieces.push_back(text.substr(begin, end - begin));
        begin = end + delimiter.size();
        end = text.find(delimiter, begin);
    }
    // `begin` may lie past the end, as the first cut skips more than the one character it found.
    pieces.push_back(text.substr(std::min(begin, text.size())));
    out = std::move(pieces);
}

void TallyCommon::BootNotFinish() {
    // Another thread may set the flag during the nap.
    while (!mBootFinished) {
        char text[PROP_VALUE_MAX] = {};
        // [sic] "unkown": any text would do that is no number.
        property_get("service.bootanim.exit", text, "unkown");
        int32_t exited = 0;
        parseInt32(text, &exited);
        if (exited == 1) {
            mBootFinished = true;
            return;
        }
        usleep(kBootPollUs);
    }
}

}  // namespace android
