#include "report/OriginText.h"

#include <algorithm>

#include "report/Text.h"
#include "trace/TraceTime.h"

namespace report {

namespace {

constexpr int64_t kMsPerDay = 86'400'000;

/** A moment of the trace, in ms, with its date if `origin` knows that of the first day. */
std::string formatMoment(int64_t ms, const trace::Origin& origin) {
    const int64_t day = ms / kMsPerDay;
    const std::string time = formatTimeOfDay(ms * trace::kNsPerMs);
    if (origin.firstDay) return formatDate(*origin.firstDay + day) + ' ' + time;
    return "day " + std::to_string(day + 1) + ' ' + time;
}

std::string describeKnown(const char* what, const std::vector<trace::Interval>& known,
                          const trace::Origin& origin) {
    std::string spans;
    for (const trace::Interval& each : known) {
        spans += (spans.empty() ? "known from " : ", ") + formatMoment(each.from, origin) + " to " +
                 formatMoment(each.to, origin);
    }
    return std::string(what) + ' ' + (spans.empty() ? "unknown" : spans);
}

}  // namespace

std::vector<std::string> describe(const Input& input) {
    std::vector<std::string> lines;
    if (input.origin != nullptr) {
        const trace::Origin& origin = *input.origin;
        if (origin.taken) lines.push_back("taken " + safe(*origin.taken));
        lines.push_back(count(origin.registrationCount, "registration") + " from " +
                        formatMoment(origin.registrations.from, origin) + " to " +
                        formatMoment(origin.registrations.to, origin));
        lines.push_back(describeKnown("display", origin.displayKnown, origin));
        lines.push_back(describeKnown("charger", origin.chargeKnown, origin));
    }
    for (const std::string& warning : input.warnings) lines.push_back(safe(warning));
    return lines;
}

int64_t lastKnown(const Input& input, int64_t end) {
    if (input.origin == nullptr) return end;
    return std::min(end, input.origin->knownTo * trace::kNsPerMs);
}

std::string count(int64_t number, const std::string& noun) {
    return std::to_string(number) + ' ' + noun + (number == 1 ? "" : "s");
}

}  // namespace report
