#include "report/CaptureFacts.h"

#include "base/Calendar.h"
#include "report/Format.h"
#include "report/Text.h"

namespace report {

namespace {

std::string formatMomentMs(int64_t ms, const day::Notes& notes) {
    return formatMoment(ms * base::kNsPerMs, notes);
}

std::string describeKnown(const char* what, const std::vector<trace::Interval>& known,
                          const day::Notes& notes) {
    std::string spans;
    for (const trace::Interval& each : known) {
        spans += (spans.empty() ? " known from " : ", ") + formatMomentMs(each.from, notes) +
                 " to " + formatMomentMs(each.to, notes);
    }
    return what + (spans.empty() ? " unknown" : spans);
}

void describe(const day::Notes& notes, std::vector<std::string>* lines) {
    const trace::CaptureNote& capture = *notes.capture;
    if (capture.taken) lines->push_back("taken " + safe(*capture.taken));
    lines->push_back(count(static_cast<size_t>(capture.registrations), "registration") + " from " +
                     formatMomentMs(capture.from, notes) + " to " +
                     formatMomentMs(capture.to, notes));
    const auto known = notes.known.value_or(trace::KnownStates());
    lines->push_back(describeKnown("display", known.display, notes));
    lines->push_back(describeKnown("charger", known.charge, notes));
    for (const std::string& warning : capture.warnings) lines->push_back(safe(warning));
}

}  // namespace

std::string formatMoment(int64_t ns, const day::Notes& notes) {
    const int64_t day = ns / base::kNsPerDay;
    const std::string time = formatTimeOfDay(ns);
    if (notes.firstDay) return base::formatDate(*notes.firstDay + day) + ' ' + time;
    return "day " + std::to_string(day + 1) + ' ' + time;
}

std::vector<std::string> describeCaptures(const day::Journal& journal) {
    std::vector<std::string> lines;
    for (const day::Notes& notes : journal.captures) describe(notes, &lines);
    return lines;
}

std::vector<std::string> describeBounds(const day::Journal& journal) {
    constexpr const char* kBounds[] = {nullptr, nullptr, "the report's header",
                                       "the newest registration", "the newest recent event"};
    std::vector<std::string> lines;
    for (const day::Notes& notes : journal.captures) {
        const char* bound = kBounds[static_cast<size_t>(notes.capture->bound)];
        if (bound == nullptr) continue;
        lines.push_back(std::string("The capture does not say when it was taken: what is known is "
                                    "bounded by ") +
                        bound + ", at " + formatMoment(*notes.knownTo(), notes) + '.');
    }
    return lines;
}

std::string nameDay(const day::Journal& journal, const day::Day& day) {
    const auto& boots = journal.boots;
    if (const auto firstDay = boots[static_cast<size_t>(day.boot)].firstDay) {
        return base::formatDate(*firstDay + day.number);
    }
    const std::string name = "day " + std::to_string(day.number + 1);
    return boots.size() == 1 ? name : "boot " + std::to_string(day.boot + 1) + ", " + name;
}

std::string describePlayed(const day::Journal& journal) {
    return count(journal.boots.size(), "boot") + ", " + formatDuration(journal.played()) +
           " of the device's time";
}

std::string count(size_t number, const std::string& noun) {
    return std::to_string(number) + ' ' + noun + (number == 1 ? "" : "s");
}

}  // namespace report
