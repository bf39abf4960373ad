#include "day/Spans.h"

#include <algorithm>

#include "base/Calendar.h"
#include "trace/TraceTime.h"

namespace day {

int64_t toClock(int64_t ms) {
    return std::clamp<int64_t>(ms, 0, trace::kMaxTimeMs) * base::kNsPerMs;
}

std::vector<Span> spansOf(const std::vector<trace::Interval>& intervals) {
    std::vector<Span> spans;
    int64_t end = 0;
    for (const trace::Interval& each : intervals) {
        const Span span{std::max(toClock(each.from), end), toClock(each.to)};
        if (span.from >= span.to) continue;
        spans.push_back(span);
        end = span.to;
    }
    return spans;
}

std::vector<Span> commonOf(const std::vector<Span>& a, const std::vector<Span>& b) {
    std::vector<Span> common;
    for (auto inA = a.begin(), inB = b.begin(); inA != a.end() && inB != b.end();) {
        const Span span{std::max(inA->from, inB->from), std::min(inA->to, inB->to)};
        if (span.from < span.to) common.push_back(span);
        if (inA->to < inB->to) {
            ++inA;
        } else {
            ++inB;
        }
    }
    return common;
}

std::vector<Span> without(Span span, const std::vector<Span>& others) {
    std::vector<Span> rest;
    for (const Span& other : others) {
        if (span.from >= span.to) return rest;
        if (other.from > span.from) rest.push_back({span.from, std::min(other.from, span.to)});
        span.from = std::max(span.from, other.to);
    }
    if (span.from < span.to) rest.push_back(span);
    return rest;
}

int64_t lengthOf(const std::vector<Span>& spans) {
    int64_t length = 0;
    for (const Span& span : spans) length += span.to - span.from;
    return length;
}

}  // namespace day
