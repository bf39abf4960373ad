#include "base/Nearest.h"

#include <algorithm>
#include <cstddef>
#include <numeric>

namespace base {

namespace {

constexpr size_t kLongest = 100;  // of a name that is worth a comparison

/** How many characters have to be put in, left out or replaced to make `b` of `a`. */
size_t distance(std::string_view a, std::string_view b) {
    std::vector<size_t> row(b.size() + 1);  // of the prefix of `a` so far to each prefix of `b`
    std::iota(row.begin(), row.end(), size_t{0});
    for (size_t i = 0; i < a.size(); ++i) {
        size_t diagonal = row[0]++;
        for (size_t j = 0; j < b.size(); ++j) {
            const size_t replaced = diagonal + (a[i] == b[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({replaced, diagonal + 1, row[j] + 1});
        }
    }
    return row.back();
}

}  // namespace

std::string_view nearest(std::string_view name, const std::vector<std::string_view>& candidates) {
    name = name.substr(0, kLongest);
    return *std::min_element(candidates.begin(), candidates.end(),
                             [&](std::string_view a, std::string_view b) {
                                 return distance(name, a) < distance(name, b);
                             });
}

}  // namespace base
