#pragma once

#include <array>
#include <optional>
#include <string>

namespace record {

/**
 * The display of a replay: what it has to show for a sample to give what it gave here. Not safe for
 * threads by itself.
 */
class Screen {
public:
    /**
     * A sample of `rect` (left, top, right, bottom) has given `rgb`, or has failed if that is null.
     * Returns the body of the "display" line that lets a replay give the same, or "" if none is
     * needed. Why a sample has failed is not known; a replay fails to capture.
     */
    std::string take(const int* rgb, const int* rect);

    /** A replay that begins now knows nothing. */
    void forget() { *this = Screen(); }

private:
    using Size = std::array<int, 2>;
    using Color = std::array<int, 3>;

    std::optional<Size> mSize;
    std::optional<Color> mColor;
    std::optional<bool> mFails;
};

}  // namespace record
