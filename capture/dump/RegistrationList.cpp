#include "capture/dump/RegistrationList.h"

#include <utility>

#include "capture/text/CaptureText.h"

namespace capture {

void RegistrationList::begin() {
    if (!mRegistrations.empty()) return;
    mPlace = Place::kInside;
    mRefused.clear();  // of a section that does not count
}

void RegistrationList::takeLine(std::string_view text, int64_t lineNumber) {
    if (mPlace == Place::kInside || mPlace == Place::kBlank) {
        takeInside(text, lineNumber);
    } else if (mPlace == Place::kBehind && looksLikeRegistration(text)) {
        mBehind.add(text, lineNumber);
    }
}

// An empty line ends the section, unless an editor has doubled the line ends: then a registration
// follows it.
void RegistrationList::takeInside(std::string_view text, int64_t lineNumber) {
    if (text.empty()) {
        mPlace = Place::kBlank;
    } else if (looksLikeRegistration(text)) {
        mPlace = Place::kInside;
        takeRegistration(text, lineNumber);
    } else if (mPlace == Place::kBlank || endsWith(text, ":") || startsWith(text, "-----")) {
        mPlace = Place::kBehind;
    } else {
        mUnknown.add(text, lineNumber);
    }
}

void RegistrationList::takeRegistration(std::string_view text, int64_t lineNumber) {
    auto registration = parseRegistration(text, lineNumber);
    if (!registration) {
        mUnreadable.add(text, lineNumber);
    } else if (registration->tookPlace()) {
        mRegistrations.push_back(std::move(*registration));
    } else if (registration->on) {
        mRefused.push_back({std::move(*registration), mRegistrations.size()});
    }
}

}  // namespace capture
