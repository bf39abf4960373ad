#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Registration.h"

namespace capture {

/** Lines that are left out: how many, and the first of them. */
struct SkippedLines {
    int64_t count = 0;
    int64_t firstNumber = 0;
    std::string firstText;  // its start

    void add(std::string_view text, int64_t lineNumber);
};

/** The section of previous registrations, line by line. Nothing in it is lost without a word. */
class RegistrationList {
public:
    /** The section's heading has come. Only the first section with registrations counts. */
    void begin();

    /** Takes a line of the sensor service, without blanks around it. */
    void line(std::string_view text, int64_t lineNumber);

    /** The sensor service's text is over. */
    void end() { mPlace = Place::kOver; }

    /** The sensor service's text begins again. */
    void repeat() { mPlace = mRegistrations.empty() ? Place::kBefore : Place::kBehind; }

    bool empty() const { return mRegistrations.empty(); }

    /** Those taken so far, newest first. */
    std::vector<Registration>& registrations() { return mRegistrations; }

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

    void lineInside(std::string_view text, int64_t lineNumber);

    Place mPlace = Place::kBefore;
    std::vector<Registration> mRegistrations;
    SkippedLines mUnreadable;
    SkippedLines mBehind;
    SkippedLines mUnknown;
};

}  // namespace capture
