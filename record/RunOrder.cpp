#include "record/RunOrder.h"

#include <utility>

namespace record {

void RunOrder::begin(Run* run) {
    run->isOrdered = true;
    run->older = mNewest;
    (mNewest != nullptr ? mNewest->newer : mOldest) = run;
    mNewest = run;
}

bool RunOrder::mayWrite(Run* run, std::string_view line) {
    if (run == mOldest || !run->isOrdered) return true;
    run->held.append(line);
    return false;
}

std::string RunOrder::end(Run* run) {
    if (!run->isOrdered) return {};
    run->isOrdered = false;
    (run->older != nullptr ? run->older->newer : mOldest) = run->newer;
    (run->newer != nullptr ? run->newer->older : mNewest) = run->older;
    std::string lines = std::move(run->held) + run->after;
    if (run->older != nullptr) {
        run->older->after += lines;
        return {};
    }
    if (mOldest != nullptr) lines += std::exchange(mOldest->held, {});
    return lines;
}

}  // namespace record
