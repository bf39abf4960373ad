#include "trace/JsonText.h"

#include <json/json.h>

namespace trace {

std::string toJson(std::string_view text) {
    return Json::valueToQuotedString(std::string(text).c_str());
}

}  // namespace trace
