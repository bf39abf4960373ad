#include "report/Page.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <limits>

#include "report/DayPicture.h"
#include "report/OriginText.h"
#include "report/Text.h"

namespace report {

namespace {

constexpr size_t kAllRows = std::numeric_limits<size_t>::max();

constexpr char kHead[] = R"(<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<meta http-equiv="Content-Security-Policy" content="default-src 'none'; style-src 'unsafe-inline'">
<style>
:root { color-scheme: light dark; --text: #222; --back: #fff; --faint: #777; --line: #ddd;
  --slice: #2a6fbb; --display: #f3e7b3; --charge: #6bb36b; --report: #c23b3b; }
@media (prefers-color-scheme: dark) { :root { --text: #ddd; --back: #1b1b1d; --faint: #999;
  --line: #3a3a3d; --slice: #6aa9ee; --display: #4a4423; --charge: #4c8f4c; --report: #ee7a7a; } }
body { font: 15px/1.45 sans-serif; color: var(--text); background: var(--back); margin: 1em auto;
  max-width: 70em; padding: 0 1em; overflow-wrap: anywhere; }
h1 { font-size: 1.3em; } h2 { font-size: 1.15em; margin-top: 2em; } h3 { font-size: 1em; }
.wide { overflow-x: auto; }
table { border-collapse: collapse; font-size: 0.9em; margin: 0.5em 0; }
th, td { text-align: left; padding: 0.2em 0.9em 0.2em 0; border-bottom: 1px solid var(--line);
  vertical-align: top; unicode-bidi: isolate; }
.number { text-align: right; font-variant-numeric: tabular-nums; white-space: nowrap; }
svg { display: block; border: 1px solid var(--line); margin: 0.5em 0; }
svg text { font: 11px sans-serif; fill: var(--text); unicode-bidi: isolate; }
svg text.hour { fill: var(--faint); } line.hour { stroke: var(--line); }
.slice { fill: var(--slice); stroke: var(--slice); stroke-width: 1; }
.display { fill: var(--display); } .charge { fill: var(--charge); }
line.report { stroke: var(--report); stroke-width: 2; stroke-dasharray: 3 2; }
.legend { color: var(--faint); font-size: 0.85em; }
@media print { body { max-width: none; } svg, table { break-inside: avoid; } }
</style>
)";

constexpr char kLegend[] =
        "<p class=\"legend\">Bars: sensors held. Shaded: display on. Green above: charging. "
        "Dashed: "
        "reports. A pointer over any of them tells more.</p>\n";

std::string element(const char* tag, const std::string& text) {
    return std::string("<") + tag + '>' + escape(text) + "</" + tag + ">\n";
}

std::string inRoom(const Table& table) {
    return "<div class=\"wide\">" + table.html() + "</div>\n";
}

}  // namespace

void Page::end(bool isWhole) {
    mJournal.end();
    const std::string text = html(isWhole);
    std::FILE* const file = std::fopen(mPath.c_str(), "we");
    bool isGood = file != nullptr && std::fwrite(text.data(), 1, text.size(), file) == text.size();
    if (file != nullptr) isGood = std::fclose(file) == 0 && isGood;
    if (!isGood) mFailure = trace::Failure{mPath + ": cannot write: " + std::strerror(errno)};
}

std::string Page::html(bool isWhole) const {
    const std::string name = safe(mJournal.input().name);
    std::string html = std::string("<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n") + kHead +
                       element("title", name) + "</head>\n<body>\n" + element("h1", name);
    for (const std::string& line : describe(mJournal.input())) html += element("p", line);
    if (!isWhole) html += element("p", "The replay has stopped before the end.");
    for (const Day& day : mJournal.days()) html += dayHtml(day);
    html += reasonsHtml();
    if (!mJournal.properties().empty()) {
        html += element("h2", "Stored at the end") + inRoom(layOut(mJournal.properties()));
    }
    html += element("p", "Played " + count(mJournal.boots(), "boot") + ", " +
                                 formatDuration(mJournal.played()) + " of the device's time.");
    return html + "</body>\n</html>\n";
}

std::string Page::dayHtml(const Day& day) const {
    std::string html = element("h2", mJournal.nameDay(day));
    const std::string picture = drawDay(mJournal, day);
    if (!picture.empty()) html += picture + kLegend;
    const auto uses = mJournal.uses().usesOf(day);
    if (!uses.empty()) html += inRoom(layOut(uses, mJournal.input().origin, kAllRows));
    std::string events;
    for (const auto& [boot, event] : mJournal.events()) {
        if (boot == day.boot && event.at / kNsPerDay == day.number) events += eventHtml(event);
    }
    if (events.empty()) return html + element("p", "The device reports nothing.");
    return html + element("h3", "The device reports") + events;
}

std::string Page::eventHtml(const Event& event) const {
    const EventText text = layOut(event, kAllRows);
    std::string html = element("p", text.title);
    std::string values;
    for (const auto& [what, value] : text.values) values += element("li", what + ": " + value);
    if (!values.empty()) html += "<ul>\n" + values + "</ul>\n";
    for (const Table& list : text.lists) html += inRoom(list);
    return html;
}

std::string Page::reasonsHtml() const {
    const auto reasons = mJournal.reasons();
    if (reasons.empty()) return {};
    std::string html = element("h2", "Why times held and times reported differ");
    for (const auto& [text, names] : reasons) {
        html += element("p", text + ":") + "<ul>\n";
        for (const std::string& name : names) html += element("li", safe(name));
        html += "</ul>\n";
    }
    return html;
}

}  // namespace report
