#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

#include "capture/dump/Registration.h"
#include "capture/dump/SkippedLines.h"

namespace capture {

/** A registration of which nothing came, and its place among those that took place. */
struct RefusedLine {
    Registration line;
    size_t newer;  // how many are newer
};

/** The section of previous registrations, line by line. Nothing in it is lost without a word. */
class RegistrationList {
public:
    /** The section's heading has come. Only the first section with registrations counts. */
    void begin();

    /** Takes a line of the sensor service, without blanks around it. */
    void takeLine(std::string_view text, int64_t lineNumber);

    /** The sensor service's text is over. */
    void end() { mPlace = Place::kOver; }

    /** The sensor service's text begins again. */
    void repeat() { mPlace = mRegistrations.empty() ? Place::kBefore : Place::kBehind; }

    /** Whether no registration took place. */
    bool empty() const { return mRegistrations.empty(); }

    /** Those that took place, newest first. */
    std::vector<Registration>& registrations() { return mRegistrations; }
    const std::vector<Registration>& registrations() const { return mRegistrations; }

    /** Enables of which nothing came, newest first. */
    const std::vector<RefusedLine>& refused() const { return mRefused; }

    /** Look like registrations, but cannot be read. */
    const SkippedLines& unreadable() const { return mUnreadable; }

    /** Look like registrations, but stand behind the section's end. */
    const SkippedLines& behind() const { return mBehind; }

    /** Of a form that only their maker knows. */
    const SkippedLines& unknown() const { return mUnknown; }

private:
    enum class Place {
        kBefore,
        kInside,
        kBlank,   // inside, if another registration follows the empty line
        kBehind,  // in the rest of the service's text
        kOver,
    };

    void takeInside(std::string_view text, int64_t lineNumber);
    void takeRegistration(std::string_view text, int64_t lineNumber);

    Place mPlace = Place::kBefore;
    std::vector<Registration> mRegistrations;
    std::vector<RefusedLine> mRefused;
    SkippedLines mUnreadable;
    SkippedLines mBehind;
    SkippedLines mUnknown;
};

}  // namespace capture
