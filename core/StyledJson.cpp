#include "core/StyledJson.h"

#include <algorithm>

#include <json/json.h>

namespace android {

std::string styledOnOneLine(const Json::Value& value) {
    std::string text = value.toStyledString();
    text.erase(std::remove(text.begin(), text.end(), '\n'), text.end());
    text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
    return text;
}

}  // namespace android
