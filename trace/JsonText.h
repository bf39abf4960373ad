#pragma once

#include <string>
#include <string_view>

namespace trace {

/** `text` as a JSON string, in ASCII; bytes that are not UTF-8 become U+FFFD. */
std::string toJson(std::string_view text);

}  // namespace trace
