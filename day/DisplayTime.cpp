#include "day/DisplayTime.h"

#include <algorithm>

namespace day {

DisplayTime DisplayCourse::within(Span span, const std::optional<std::vector<Span>>& known) const {
    DisplayTime time;
    if (mChanges.empty()) return time;
    span.from = std::max(span.from, mChanges.front().at);
    for (const Span& part : commonOf({span}, known.value_or(std::vector{span}))) {
        time.known += part.to - part.from;
        time.on += timeOn(part);
    }
    return time;
}

int64_t DisplayCourse::timeOn(Span span) const {
    int64_t time = 0;
    auto change = std::upper_bound(mChanges.begin(), mChanges.end(), span.from,
                                   [](int64_t at, const Change& each) { return at < each.at; });
    if (change != mChanges.begin()) --change;
    for (; change != mChanges.end() && change->at < span.to; ++change) {
        const auto next = change + 1;
        const int64_t end = next == mChanges.end() ? span.to : std::min(next->at, span.to);
        if (change->isOn) time += end - std::max(change->at, span.from);
    }
    return time;
}

}  // namespace day
