#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "day/Spans.h"

namespace day {

/** For how much of a span the display is known, and for how much of that it was on; ns. */
struct DisplayTime {
    int64_t known = 0;
    int64_t on = 0;

    int64_t off() const { return known - on; }
    void add(const DisplayTime& more) {
        known += more.known;
        on += more.on;
    }
};

/** The display through one boot. It is known from the first time that it is told. */
class DisplayCourse {
public:
    /** From `at` on it is on, or off; times do not go back. */
    void change(int64_t at, bool isOn) { mChanges.push_back({at, isOn}); }

    /** A new boot: nothing is known yet. */
    void clear() { mChanges.clear(); }

    /**
     * The display within `span`, which must not end later than what is told. `known` bounds what is
     * known; nothing: it has no bounds.
     */
    DisplayTime within(Span span, const std::optional<std::vector<Span>>& known) const;

private:
    struct Change {
        int64_t at;
        bool isOn;
    };

    int64_t timeOn(Span span) const;

    std::vector<Change> mChanges;  // in order
};

}  // namespace day
