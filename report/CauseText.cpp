#include <cstddef>
#include <set>
#include <string>

#include "report/Names.h"
#include "report/Sections.h"
#include "report/Text.h"

namespace report {

using day::Cause;

namespace {

/** In the order of `Cause`. */
constexpr const char* kTexts[] = {
        "still on at the daily report, so not in it, and wiped by its reset",
        "no line tells its end, so that for the library it went on",
        "no daily report came after the use",
        "the daily reset came between the use and its report",
        "time counts only at the sensor's running rate, and another app asked for a faster one",
        "time at one rate counts for one app only, and another app had the same rate",
        "an app's first rate stays its rate until it is reported, and it asked for another one",
        "the sensor ran at a rate that nobody holds any more",
        "uses of one app at the same time count as one",
        "whole seconds count, and less than one passed at a time",
        "a report names 50 apps, and others had more time",
        "proximity is reported only for uses of more than 30 minutes",
        "proximity is reported when the use ends, and it is still on",
        "proximity is not reported for system apps",
        "nobody watches the sensor",
};

}  // namespace

Section layOutCauses(const day::Causes& causes) {
    Section section;
    section.heading = "Why times held and times reported differ";
    for (const auto& [cause, uses] : causes) {
        std::set<std::string> names;
        for (const day::Use* use : uses) {
            names.insert(cause == Cause::kNobodyWatches ? nameSensor(*use) : nameApp(*use));
        }
        Section::List& list = section.lists.emplace_back();
        list.title = std::string(kTexts[static_cast<size_t>(cause)]) + ':';
        for (const std::string& name : names) list.items.push_back(safe(name));
    }
    return section;
}

}  // namespace report
