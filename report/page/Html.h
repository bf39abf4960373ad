#pragma once

#include <string>
#include <string_view>

namespace report::page {

/** "<TAG>text</TAG>" on a line of its own; `attributes` is markup. */
std::string element(std::string_view tag, std::string_view text, std::string_view attributes = {});

/** ` NAME="value"`. */
std::string attribute(std::string_view name, std::string_view value);

/** `text` as markup that may break where the parts of a name meet. */
std::string breakable(std::string_view text);

}  // namespace report::page
