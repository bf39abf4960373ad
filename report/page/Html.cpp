#include "report/page/Html.h"

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

}  // namespace report::page
