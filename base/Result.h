#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>

#include <tl/expected.hpp>

namespace base {

// Exit statuses of the tool.

inline constexpr int kStatusFailed = 1;    // the tool or the library failed
inline constexpr int kStatusBadInput = 2;  // an argument or a file is wrong
inline constexpr int kStatusDiffers = 3;   // the replay differs from what was expected

/** Why the tool stops. */
struct Failure {
    std::string text;  // one line for standard error
    int status = kStatusBadInput;
};

/** What an operation gives: its value, or why there is none. */
template <typename T>
using Result = tl::expected<T, Failure>;

inline tl::unexpected<Failure> fail(std::string text, int status = kStatusBadInput) {
    return tl::unexpected<Failure>({std::move(text), status});
}

/** "FILE:LINE: ", in front of what is wrong with a line of a file. */
inline std::string at(std::string_view file, int64_t line) {
    return std::string(file) + ':' + std::to_string(line) + ": ";
}

}  // namespace base
