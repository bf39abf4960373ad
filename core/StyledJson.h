#pragma once

#include <string>

#include <json/forwards.h>

namespace android {

/** `value` in jsoncpp's styled layout without its line breaks. The indentation stays. */
std::string styledOnOneLine(const Json::Value& value);

}  // namespace android
