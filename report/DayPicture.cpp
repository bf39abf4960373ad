#include "report/DayPicture.h"

#include <algorithm>
#include <cstddef>
#include <cstdio>
#include <map>
#include <utility>
#include <vector>

#include "report/SensorNames.h"
#include "report/Text.h"

namespace report {

namespace {

constexpr int64_t kNsPerHour = 3'600'000'000'000;

// Heights in pixels.
constexpr int kAxis = 18;    // the hours above the lanes
constexpr int kLane = 32;    // a label and a bar
constexpr int kLabel = 14;   // from a lane's top to its label's line
constexpr int kBarTop = 18;  // from a lane's top to its bar
constexpr int kBar = 10;
constexpr size_t kLabelColumns = 90;

using Lanes = std::map<std::pair<std::string, int32_t>, std::vector<const Slice*>>;

/** A day's picture while it is drawn. */
class Picture {
public:
    Picture(const Journal& journal, const Day& day)
          : mJournal(journal),
            mDay(day),
            mMidnight(day.number * kNsPerDay) {
        for (const auto& [boot, slice] : journal.slices()) {
            if (boot != day.boot || slice.from >= mMidnight + kNsPerDay) continue;
            if (slice.to < mMidnight) continue;
            mLanes[{slice.app, slice.type}].push_back(&slice);
        }
        findRange();
    }

    std::string draw() {
        if (mLanes.empty()) return {};
        const int height = kAxis + kLane * static_cast<int>(mLanes.size()) + 4;
        mHeight = std::to_string(height);
        mSvg = "<svg width=\"100%\" height=\"" + mHeight + "\" role=\"img\" aria-label=\"" +
               escape(mJournal.nameDay(mDay)) + "\">\n";
        drawBands(mJournal.display(), "display", [](int32_t value) { return value == 1; });
        drawBands(mJournal.charge(), "charge",
                  [](int32_t value) { return value > 0 && value < 4; });
        drawHours();
        int top = kAxis;
        for (const auto& [key, slices] : mLanes) {
            drawLane(key.first, key.second, slices, top);
            top += kLane;
        }
        drawReports();
        return mSvg + "</svg>\n";
    }

private:
    /** From a full hour to a full hour, around all slices. */
    void findRange() {
        mFrom = mMidnight + kNsPerDay;
        mTo = mMidnight;
        for (const auto& [key, slices] : mLanes) {
            for (const Slice* slice : slices) {
                mFrom = std::min(mFrom, std::max(slice->from, mMidnight));
                mTo = std::max(mTo, std::min(slice->to, mMidnight + kNsPerDay));
            }
        }
        mFrom = mFrom / kNsPerHour * kNsPerHour;
        mTo = std::max((mTo + kNsPerHour - 1) / kNsPerHour * kNsPerHour, mFrom + kNsPerHour);
    }

    /** A moment as a share of the width, as an attribute has it. */
    std::string across(int64_t at) const {
        const double share = static_cast<double>(std::clamp(at, mFrom, mTo) - mFrom) /
                             static_cast<double>(mTo - mFrom) * 100;
        char text[32];
        std::snprintf(text, sizeof(text), "%.3f%%", share);
        return text;
    }

    std::string extent(Span span) const {
        const int64_t from = std::clamp(span.from, mFrom, mTo);
        return "x=\"" + across(from) + "\" width=\"" +
               across(mFrom + std::clamp(span.to, mFrom, mTo) - from) + "\"";
    }

    template <typename IsShown>
    void drawBands(const std::vector<StateSpan>& spans, const std::string& kind, IsShown isShown) {
        for (const auto& [boot, span, value] : spans) {
            if (boot != mDay.boot || !isShown(value) || span.to <= mFrom || span.from >= mTo) {
                continue;
            }
            const bool isDisplay = kind == "display";
            mSvg += "<rect class=\"" + kind + "\" " + extent(span) + " y=\"" +
                    (isDisplay ? "0" : std::to_string(kAxis - 4)) + "\" height=\"" +
                    (isDisplay ? mHeight : "4") + "\"><title>" +
                    (isDisplay ? "display on" : "charging") + ' ' + fromTo(span) +
                    "</title></rect>\n";
        }
    }

    void drawHours() {
        const int64_t hours = (mTo - mFrom) / kNsPerHour;
        const int64_t step = hours > 12 ? 3 : hours > 6 ? 2 : 1;
        for (int64_t at = mFrom; at < mTo; at += step * kNsPerHour) {
            const std::string x = across(at);
            mSvg += "<line class=\"hour\" x1=\"" + x + "\" x2=\"" + x + "\" y1=\"0\" y2=\"" +
                    mHeight + "\"/><text class=\"hour\" x=\"" + x + "\" dx=\"2\" y=\"10\">" +
                    formatTimeOfDay(at).substr(0, 5) + "</text>\n";
        }
    }

    void drawLane(const std::string& app, int32_t type, const std::vector<const Slice*>& slices,
                  int top) {
        const std::string name = app + ", " + nameSensor(type, mJournal.input().origin);
        mSvg += "<text class=\"lane\" x=\"0\" y=\"" + std::to_string(top + kLabel) + "\">" +
                escape(cut(safe(name), kLabelColumns)) + "</text>\n";
        for (const Slice* slice : slices) {
            mSvg += "<rect class=\"slice\" " + extent({slice->from, slice->to}) + " y=\"" +
                    std::to_string(top + kBarTop) + "\" height=\"" + std::to_string(kBar) +
                    "\"><title>" + escape(safe(name)) + ", " + rateOf(*slice) + ", " +
                    fromTo({slice->from, slice->to}) + (slice->isOpen ? ", still on" : "") +
                    "</title></rect>\n";
        }
    }

    void drawReports() {
        for (const auto& [boot, event] : mJournal.events()) {
            if (boot != mDay.boot || event.at / kNsPerDay != mDay.number) continue;
            const std::string x = across(event.at);
            mSvg += "<line class=\"report\" x1=\"" + x + "\" x2=\"" + x + "\" y1=\"" +
                    std::to_string(kAxis) + "\" y2=\"" + mHeight + "\"><title>" +
                    escape(layOut(event, 0).title) + "</title></line>\n";
        }
    }

    static std::string rateOf(const Slice& slice) {
        int64_t fastest = slice.enables.front().periodNs;
        for (const Enable& enable : slice.enables) fastest = std::min(fastest, enable.periodNs);
        return fastest > 0 ? formatRate(fastest) + " Hz" : "fastest";
    }

    static std::string fromTo(Span span) {
        return "from " + formatTimeOfDay(span.from) + " to " + formatTimeOfDay(span.to);
    }

    const Journal& mJournal;
    const Day mDay;
    const int64_t mMidnight;
    Lanes mLanes;
    int64_t mFrom = 0;  // of the picture, ns
    int64_t mTo = 0;
    std::string mHeight;
    std::string mSvg;
};

}  // namespace

std::string drawDay(const Journal& journal, const Day& day) {
    return Picture(journal, day).draw();
}

}  // namespace report
