#include "report/page/Html.h"

#include <cctype>
#include <cstddef>

#include "report/Text.h"

namespace report::page {

std::string element(std::string_view tag, std::string_view text, std::string_view attributes) {
    std::string html = "<";
    html.append(tag).append(attributes).append(">").append(escape(text));
    return html.append("</").append(tag).append(">\n");
}

std::string attribute(std::string_view name, std::string_view value) {
    std::string html = " ";
    return html.append(name).append("=\"").append(escape(value)).append("\"");
}

std::string breakable(std::string_view text) {
    const std::string escaped = escape(text);
    std::string html;
    for (size_t i = 0; i < escaped.size(); ++i) {
        const char c = escaped[i];
        const bool isWithinName =
                i + 1 < escaped.size() && std::isalpha(escaped[i + 1] & 0x7f) != 0;
        html += c;
        if (c == '/' || c == '$' || (c == '.' && isWithinName)) html += "<wbr>";
    }
    return html;
}

}  // namespace report::page
