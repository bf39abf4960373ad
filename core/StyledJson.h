#pragma once

#include <string>

#include <json/forwards.h>

namespace android {

/** `value` as jsoncpp's styled writer lays it out, without the line breaks: indentation stays. */
std::string styledOnOneLine(const Json::Value& value);

}  // namespace android
