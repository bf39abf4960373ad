#include "record/StintOrder.h"

#include <utility>

namespace record {

void StintOrder::begin(Stint* stint) {
    stint->isOrdered = true;
    stint->older = mNewest;
    stint->newer = nullptr;
    (mNewest != nullptr ? mNewest->newer : mOldest) = stint;
    mNewest = stint;
}

bool StintOrder::mayWrite(Stint* stint, std::string_view line) {
    if (stint == mOldest || !stint->isOrdered) return true;
    stint->held.append(line);
    mHeldBytes += line.size();
    return false;
}

std::string StintOrder::end(Stint* stint) {
    if (!stint->isOrdered) return {};
    remove(stint);
    std::string lines = std::exchange(stint->held, {}) + std::exchange(stint->after, {});
    if (stint->older != nullptr) {
        stint->older->after += lines;
        return {};
    }
    if (mOldest != nullptr) lines += std::exchange(mOldest->held, {});
    mHeldBytes -= lines.size();
    return lines;
}

void StintOrder::clear() {
    while (mOldest != nullptr) {
        Stint* const stint = mOldest;
        remove(stint);
        stint->held.clear();
        stint->after.clear();
    }
    mHeldBytes = 0;
}

void StintOrder::remove(Stint* stint) {
    stint->isOrdered = false;
    (stint->older != nullptr ? stint->older->newer : mOldest) = stint->newer;
    (stint->newer != nullptr ? stint->newer->older : mNewest) = stint->older;
}

}  // namespace record
