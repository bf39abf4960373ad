#include "report/page/DayPicture.h"

#include <algorithm>
#include <cstddef>
#include <cstdio>

#include "base/Calendar.h"
#include "report/Format.h"
#include "report/Text.h"
#include "report/page/Html.h"

namespace report::page {

namespace {

constexpr size_t kMostLanes = 100;
constexpr size_t kMostNamed = 10;  // slices of a lane, in the lane's name
constexpr double kPixel = 0.1;     // percent of the width: about what a screen can show

std::string timeOfDay(int64_t at) {
    if (at == base::kNsPerDay) return "24:00:00";
    return formatTimeOfDay(at);
}

std::string fromTo(Span span) {
    return timeOfDay(span.from) + " to " + timeOfDay(span.to);
}

BandLane bandLane(const char* name, const char* style, const char* on, const Band& band) {
    BandLane lane{name, {}};
    for (const Span& span : band.on) lane.slices.push_back({span, style, on + fromTo(span)});
    for (const Span& span : band.unknown) {
        lane.slices.push_back({span, "unknown", "not known, " + fromTo(span)});
    }
    return lane;
}

std::vector<Slice> slicesOf(const Lane& lane) {
    std::vector<Slice> slices;
    for (const Use& use : lane.uses) {
        slices.push_back({use.span, styleOf(use), use.facts, use.isBefore, use.isOn});
    }
    return slices;
}

/** What a lane says to somebody who does not see it. */
std::string describe(const std::string& name, const std::vector<Slice>& slices) {
    std::string text = name + ": ";
    if (slices.empty()) text += "nothing";
    for (size_t i = 0; i < std::min(slices.size(), kMostNamed); ++i) {
        text.append(i == 0 ? "" : "; ").append(slices[i].facts);
    }
    if (slices.size() <= kMostNamed) return text;
    return text + "; " + std::to_string(slices.size() - kMostNamed) + " more";
}

/** A picture while it is drawn. */
class Picture {
public:
    explicit Picture(Span hours) : mHours(hours) {}

    std::string draw(const Day& day) {
        mHtml = "<div class=\"picture\">\n";
        drawBackground(day);
        drawHours();
        for (const BandLane& lane : bandsOf(day)) {
            drawLane("band", lane.name, escape(lane.name), lane.slices);
        }
        mDrawn = mTold = 0;  // of uses
        mHtml += "<div class=\"lanes\">\n";
        for (size_t i = 0; i < std::min(day.lanes.size(), kMostLanes); ++i) {
            const Lane& lane = day.lanes[i];
            drawLane("use", lane.app + ", " + lane.sensor,
                     element("b", lane.app) + element("span", lane.sensor), slicesOf(lane));
        }
        mHtml += "</div>\n</div>\n";
        return mHtml + element("p", leftOut(day.lanes.size()), " class=\"note left-out\"");
    }

private:
    double percent(int64_t at) const {
        return static_cast<double>(std::clamp(at, mHours.from, mHours.to) - mHours.from) * 100 /
               static_cast<double>(mHours.to - mHours.from);
    }

    /** A length across, which is a share of the width, so that it fits any. */
    static std::string across(const char* name, double percent) {
        char text[48];
        std::snprintf(text, sizeof(text), " %s=\"%.2f%%\"", name, percent);
        return text;
    }

    bool isOutside(Span span) const { return span.to < mHours.from || span.from > mHours.to; }

    void drawRect(std::string_view style, double from, double to, const std::string& rest) {
        mHtml += "<rect" + attribute("class", style) + across("x", from) +
                 across("width", std::max(to - from, kPixel)) + rest;
    }

    void drawSpans(const char* style, const std::vector<Span>& spans) {
        for (const Span& span : spans) {
            if (isOutside(span)) continue;
            drawRect(style, percent(span.from), percent(span.to), " height=\"100%\"/>\n");
        }
    }

    void drawLine(const char* style, int64_t at) {
        mHtml += "<line" + attribute("class", style) + across("x1", percent(at)) +
                 across("x2", percent(at)) + " y1=\"0\" y2=\"100%\"/>\n";
    }

    void drawBackground(const Day& day) {
        mHtml += "<svg aria-hidden=\"true\">\n";
        drawSpans("shade", day.display.on);
        drawSpans("unknown", day.unseen);
        for (int64_t at = mHours.from; at <= mHours.to; at += step()) drawLine("grid", at);
        for (const Mark& mark : day.marks) drawLine(lineStyleOf(mark), mark.at);
        mHtml += "</svg>\n";
    }

    void drawHours() {
        mHtml += "<div class=\"axis\"><svg aria-hidden=\"true\">\n";
        for (int64_t at = mHours.from; at < mHours.to; at += step()) {
            mHtml += "<text" + across("x", percent(at)) + " dx=\"3\" y=\"13\">" +
                     timeOfDay(at).substr(0, 5) + "</text>\n";
        }
        mHtml += "</svg></div>\n";
    }

    /** So many hours are at most six names wide, which a phone has room for. */
    int64_t step() const {
        const int64_t hours = (mHours.to - mHours.from) / base::kNsPerHour;
        return base::kNsPerHour * (hours > 12 ? 4 : hours > 6 ? 2 : 1);
    }

    /** `name` is text, `shown` the same as markup. */
    void drawLane(const char* kind, const std::string& name, const std::string& shown,
                  const std::vector<Slice>& slices) {
        mHtml += "<div class=\"lane " + std::string(kind) + "\">\n<div class=\"name\"" +
                 attribute("title", name) + ">" + shown +
                 "</div>\n<div class=\"track\"><svg role=\"img\"" +
                 attribute("aria-label", describe(name, slices)) + ">\n";
        drawSlices(slices);
        mHtml += "</svg></div>\n</div>\n";
    }

    void drawSlices(const std::vector<Slice>& slices) {
        for (auto slice = slices.begin(); slice != slices.end();) {
            if (isOutside(slice->span)) {
                ++slice;
                continue;
            }
            const auto first = slice;
            const double from = percent(first->span.from);
            double to = percent(first->span.to);
            bool isNarrow = to - from < kPixel;
            for (++slice; slice != slices.end() && !isOutside(slice->span); ++slice) {
                const double nextFrom = percent(slice->span.from);
                const double nextTo = percent(slice->span.to);
                if (nextFrom - to > kPixel || !(isNarrow || nextTo - nextFrom < kPixel)) break;
                to = std::max(to, nextTo);
                isNarrow = true;
            }
            const auto number = slice - first;
            drawSlice(*first, from, to, number);
            mDrawn += 1;
            mTold += number;
        }
    }

    void drawSlice(const Slice& slice, double from, double to, std::ptrdiff_t number) {
        const std::string facts =
                number == 1 ? slice.facts
                            : std::to_string(number) + " of them, too close to tell apart";
        drawRect(slice.style + (number == 1 ? "" : " many"), from, to,
                 " y=\"25%\" height=\"50%\"><title>" + escape(facts) + "</title></rect>\n");
        if (slice.isBefore) drawSymbol("before", from);
        if (slice.isOn) drawSymbol("on", to);
    }

    void drawSymbol(const char* name, double at) {
        mHtml += "<use href=\"#" + std::string(name) + "\"" + across("x", at) + " y=\"50%\"/>\n";
    }

    std::string leftOut(size_t lanes) const {
        std::string text;
        if (mTold > mDrawn) {
            text = std::to_string(mTold) + " uses are drawn as " + std::to_string(mDrawn) +
                   " bars, too close to tell apart. ";
        }
        if (lanes > kMostLanes) {
            text += std::to_string(lanes - kMostLanes) + " more rows are not drawn.";
        }
        return text;
    }

    const Span mHours;
    std::string mHtml;
    std::ptrdiff_t mDrawn = 0;  // bars
    std::ptrdiff_t mTold = 0;   // slices for which they stand
};

}  // namespace

std::string styleOf(const Use& use) {
    std::string style = "slice";
    if (use.isBefore) style += " before";
    if (use.isUnseen) style += " unseen";
    if (use.isOn) style += " on";
    return style;
}

const char* lineStyleOf(const Mark& mark) {
    return mark.kind == Mark::Kind::kTaken ? "taken" : "report";
}

std::vector<BandLane> bandsOf(const Day& day) {
    constexpr const char* kStyles[] = {"report", "ahead", "taken"};  // by Mark::Kind
    BandLane marks{"Reports", {}};
    for (const auto& [kind, at, text] : day.marks) {
        marks.slices.push_back({{at, at}, kStyles[static_cast<size_t>(kind)], text});
    }
    std::vector<BandLane> lanes{
            std::move(marks),
            bandLane("Display", "display", "on from ", day.display),
            bandLane("Charger", "charge", "charging from ", day.charge),
    };
    for (BandLane& lane : lanes) {
        std::stable_sort(lane.slices.begin(), lane.slices.end(),
                         [](const auto& a, const auto& b) { return a.span.from < b.span.from; });
    }
    return lanes;
}

Span hoursOf(const std::vector<Day>& days) {
    Span hours{base::kNsPerDay, 0};
    const auto take = [&hours](Span span) {
        hours.from = std::min(hours.from, span.from);
        hours.to = std::max(hours.to, span.to);
    };
    for (const Day& day : days) {
        for (const Lane& lane : day.lanes) {
            for (const Use& use : lane.uses) take(use.span);
        }
        for (const Mark& mark : day.marks) {
            if (mark.kind != Mark::Kind::kAhead) take({mark.at, mark.at});
        }
    }
    if (hours.from > hours.to) return {0, 0};
    // The last moment lies before the end.
    const auto hourOf = [](int64_t at) { return at / base::kNsPerHour * base::kNsPerHour; };
    hours.from = std::min(hourOf(hours.from), base::kNsPerDay - base::kNsPerHour);
    hours.to = std::min(hourOf(hours.to) + base::kNsPerHour, base::kNsPerDay);
    return hours;
}

std::string drawDay(const Day& day, Span hours) {
    return Picture(hours).draw(day);
}

}  // namespace report::page
