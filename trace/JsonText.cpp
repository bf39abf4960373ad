#include "trace/JsonText.h"

#include <json/json.h>

namespace trace {

std::string toJson(std::string_view text) {
    // jsoncpp quotes up to a NUL.
    std::string json = "\"";
    for (;;) {
        const std::string piece(text.substr(0, text.find('\0')));
        const std::string quoted = Json::valueToQuotedString(piece.c_str());
        json.append(quoted, 1, quoted.size() - 2);
        if (piece.size() == text.size()) return json + '"';
        json += "\\u0000";
        text.remove_prefix(piece.size() + 1);
    }
}

}  // namespace trace
