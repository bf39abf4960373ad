#include "capture/RegistrationList.h"

#include <utility>

#include "capture/CaptureText.h"

namespace capture {

namespace {

constexpr size_t kMostText = 200;  // bytes of a line that are shown

}  // namespace

void SkippedLines::add(std::string_view text, int64_t lineNumber) {
    if (count++ > 0) return;
    firstNumber = lineNumber;
    firstText = text.substr(0, kMostText);
}

void RegistrationList::begin() {
    if (mRegistrations.empty()) mPlace = Place::kInside;
}

void RegistrationList::line(std::string_view text, int64_t lineNumber) {
    if (mPlace == Place::kInside || mPlace == Place::kBlank) {
        lineInside(text, lineNumber);
    } else if (mPlace == Place::kBehind && looksLikeRegistration(text)) {
        mBehind.add(text, lineNumber);
    }
}

void RegistrationList::lineInside(std::string_view text, int64_t lineNumber) {
    if (text.empty()) {
        mPlace = Place::kBlank;
    } else if (looksLikeRegistration(text)) {
        mPlace = Place::kInside;
        if (auto registration = parseRegistration(text, lineNumber)) {
            mRegistrations.push_back(std::move(*registration));
        } else {
            mUnreadable.add(text, lineNumber);
        }
    } else if (mPlace == Place::kBlank || endsWith(text, ":") || startsWith(text, "-----")) {
        mPlace = Place::kBehind;
    } else {
        mUnknown.add(text, lineNumber);
    }
}

}  // namespace capture
