#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>
#include <vector>

#include "day/Use.h"

namespace day {

/** Uses that have ended and are not told yet: those of one moment are told together, in order. */
class EndedUses {
public:
    static constexpr int64_t kAll = std::numeric_limits<int64_t>::max();

    void add(const Use& use) { mUses.push_back(use); }

    /** Calls `tell` with each use that ended before `before`. */
    template <typename Tell>
    void tell(int64_t before, const Tell& tell) {
        std::sort(mUses.begin(), mUses.end(), isToldBefore);
        auto use = mUses.begin();
        for (; use != mUses.end() && use->to < before; ++use) tell(*use);
        mUses.erase(mUses.begin(), use);
    }

private:
    std::vector<Use> mUses;
};

}  // namespace day
