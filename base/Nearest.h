#pragma once

#include <string_view>
#include <vector>

namespace base {

/** The one of `candidates`, of which there must be one, that is spelt most like `name`. */
std::string_view nearest(std::string_view name, const std::vector<std::string_view>& candidates);

}  // namespace base
