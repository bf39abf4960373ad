#pragma once

#include <cstddef>

namespace capture {

/** Bytes that a source reads at once. */
constexpr size_t kBlock = size_t{64} << 10;

}  // namespace capture
