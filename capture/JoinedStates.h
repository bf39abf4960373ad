#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "capture/StateCourse.h"
#include "capture/dump/StateValue.h"
#include "trace/Note.h"

namespace capture {

/**
 * The course of a device's states by one or several dumps of it. Each dump tells what happened
 * since the one before. A state that was known goes idle where that knowledge ends.
 */
class JoinedStates {
public:
    /** Adds what a dump says up to `end`, when it was taken. Nothing of it if `end` is not new. */
    void add(const StateCourse& course, int64_t end);

    /** Whether an earlier dump told what happened at `time`. */
    bool isKnownUpTo(int64_t time) const { return mHasEnd && time <= mEnd; }

    /** All of it, in order. */
    StateCourse finish();

    /** When a state was known, in order. */
    const std::vector<trace::Interval>& known(State state) const {
        return mKnown[static_cast<size_t>(state)];
    }

private:
    void add(State state, const StateCourse& course, int64_t end);

    /** Ends the knowledge of a state where it has not been continued. */
    void goIdle(State state);

    std::vector<trace::Interval>& intervals(State state) {
        return mKnown[static_cast<size_t>(state)];
    }

    bool mHasEnd = false;
    int64_t mEnd = 0;  // of the last dump
    StateCourse mCourse;
    std::array<std::vector<trace::Interval>, kStates.size()> mKnown;
};

/**
 * The values to tell, in the order in which a host does: what holds at `start`, then each change.
 * Times are cut to whole seconds, of which only a state's last value counts.
 */
std::vector<StateValue> changesFrom(int64_t start, const StateCourse& course);

}  // namespace capture
